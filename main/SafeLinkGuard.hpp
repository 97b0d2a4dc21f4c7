// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <git2/types.h>

#include "main/LinkGuard.hpp"

namespace vclink::git
{

/// Refuses the safe checkout of a commit where it would go through a link: an untracked one that
/// stands where a tracked folder belongs, as git does, and an ignored one that stands where a file
/// belongs, which git overwrites. A link above files that the checkout does not touch is no
/// obstacle.
class SafeLinkGuard final : public LinkGuard
{
  public:
    /// @param target what is checked out; outlives the guard
    /// @param record as for LinkGuard; the checkout fails with GIT_ECONFLICT where a link is in the
    /// way
    SafeLinkGuard(git_repository *repository, const git_object *target,
                  git_checkout_options &record);

  private:
    int notify(git_checkout_notify_t why, const char *path, const git_diff_file *baseline,
               const git_diff_file *target, const git_diff_file *workdir) override;
    bool isChangedFolder(const std::string &name) const;

    git_repository *repository_;
    std::string target_;
};

} // namespace vclink::git
