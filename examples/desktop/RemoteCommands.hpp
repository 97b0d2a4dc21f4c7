// SPDX-License-Identifier: MIT
#pragma once

#include <functional>

#include "Context.hpp"

namespace vclink::desktop
{

/// Fetch, push, clone.
class RemoteCommands
{
  public:
    /// @param cloned called with the folder of a new working copy
    RemoteCommands(Context context, std::function<void(const upath &)> cloned);

    void fetch();
    void push();
    void clone();

  private:
    void askForRemote(const char *title, std::function<void(const std::string &)> chosen) const;
    void push(const std::string &remote, const std::string &branch);

    Context context_;
    std::function<void(const upath &)> cloned_;
};

} // namespace vclink::desktop
