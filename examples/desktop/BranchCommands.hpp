// SPDX-License-Identifier: MIT
#pragma once

#include <functional>

#include "Context.hpp"

namespace vclink::desktop
{

/// New branch, delete, switch, merge.
class BranchCommands
{
  public:
    /// @param conflicts called after a merge that left conflicts
    BranchCommands(Context context, std::function<void()> conflicts);

    void create();
    void remove();
    void change();
    void merge();

  private:
    void remove(const std::string &name);
    void merge(const std::string &name);
    void askForBranch(const char *title, const std::vector<std::string> &names,
                      std::function<void(const std::string &)> chosen) const;

    Context context_;
    std::function<void()> conflicts_;
};

} // namespace vclink::desktop
