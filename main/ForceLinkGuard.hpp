// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <utility>
#include <vector>

#include <git2/types.h>

#include "main/LinkGuard.hpp"

namespace vclink::git
{

/// Removes the links that are in the way of a checkout by force, as git does. At its end it puts
/// those back into whose place nothing has come, which are those of a checkout that failed or was
/// cancelled.
class ForceLinkGuard final : public LinkGuard
{
  public:
    /// @param record as for LinkGuard
    ForceLinkGuard(git_repository *repository, git_checkout_options &record);
    ForceLinkGuard(const ForceLinkGuard &) = delete;
    ForceLinkGuard &operator=(const ForceLinkGuard &) = delete;
    ~ForceLinkGuard();

  private:
    int notify(git_checkout_notify_t why, const char *path, const git_diff_file *baseline,
               const git_diff_file *target, const git_diff_file *workdir) override;
    void clearTheWay(const std::string &name);
    void removeLink(const std::string &path);

    std::string workdir_;
    /// What was removed: path and target.
    std::vector<std::pair<std::string, std::string>> removed_;
};

} // namespace vclink::git
