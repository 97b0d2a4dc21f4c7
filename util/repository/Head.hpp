// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <git2/oid.h>
#include <git2/types.h>

#include "error/errorUtil/OwnedHandle.hpp"

namespace vclink::git
{

/// Remembers the value of HEAD. The index lock does not protect it: `git commit` releases the lock
/// before it runs its hooks and the editor, and moves the branch afterwards. An operation that
/// continues with the old HEAD would undo that commit.
class Head
{
  public:
    /// HEAD on an unborn branch.
    Head() = default;
    /// @param reference the reference to which HEAD resolves; null on an unborn branch
    explicit Head(const git_reference *reference);

    /// git_repository_head.
    /// @throws LibGit2Exception if HEAD cannot be read
    [[nodiscard]] bool hasMoved(git_repository *repository) const;
    /// @throws LibGit2Exception with the code GIT_EMODIFIED, the class GIT_ERROR_REFERENCE and
    /// movedText if HEAD has moved
    void refuseMoved(git_repository *repository) const;

    /// The text for an operation that has not written anything.
    static const char *const movedText;

  private:
    std::string reference_;
    git_oid id_ = {};
};

/// Returns the reference to which HEAD resolves, null on an unborn branch. git_repository_head.
/// @throws LibGit2Exception
[[nodiscard]] OwnedHandle<git_reference> lookupHead(git_repository *repository);

} // namespace vclink::git
