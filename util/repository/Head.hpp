// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <git2/oid.h>
#include <git2/types.h>

#include "error/errorUtil/OwnedHandle.hpp"

namespace vclink::git
{

/// Where HEAD was. The lock of the index does not keep it there: `git commit` gives the lock up
/// before it runs its hooks and the editor, and moves the branch when they are done. What an
/// operation has read of HEAD is old then, and to go on with it would undo that commit.
class Head
{
  public:
    /// On an unborn branch.
    Head() = default;
    /// @param reference what HEAD resolves to; null on an unborn branch
    explicit Head(const git_reference *reference);

    /// git_repository_head.
    /// @throws LibGit2Exception if HEAD cannot be read
    [[nodiscard]] bool hasMoved(git_repository *repository) const;
    /// @throws LibGit2Exception if it has moved: with the code GIT_EMODIFIED, the class
    /// GIT_ERROR_REFERENCE and movedText
    void refuseMoved(git_repository *repository) const;

    /// For an operation that has not written anything.
    static const char *const movedText;

  private:
    std::string reference_;
    git_oid id_ = {};
};

/// What HEAD resolves to, null on an unborn branch. git_repository_head.
/// @throws LibGit2Exception
[[nodiscard]] OwnedHandle<git_reference> lookupHead(git_repository *repository);

} // namespace vclink::git
