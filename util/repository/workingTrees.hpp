// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/types.h>

namespace vclink::git
{

/// What git keeps about one working tree of a repository: its HEAD and an operation under way. The
/// folder with the files may be gone. References are full names.
///
/// Each function throws a LibGit2Exception if something exists and cannot be read.
class WorkingTree
{
  public:
    /// @param state the folder with the working tree's HEAD
    /// @param isBare of the repository, which has a HEAD and no working tree then
    explicit WorkingTree(std::string state, bool isBare = false);

    /// Returns true if HEAD names the branch, also through branches that are symbolic references.
    /// That of a bare repository does as well.
    bool isOn(const std::string &branch) const;
    /// Returns the reference that HEAD names as a symbolic link, which git makes for
    /// core.preferSymlinkRefs; empty if HEAD is a file. libgit2 follows the link: it takes HEAD for
    /// detached, and writes to the branch instead of HEAD.
    std::string linkedHead() const;
    bool hasCheckedOut(const std::string &branch) const;
    /// Returns true if a rebase or bisection returns to the branch in the end.
    bool returnsTo(const std::string &branch) const;
    /// Returns true if a rebase with `--update-refs` moves the branch in the end.
    bool moves(const std::string &branch) const;

  private:
    std::string state_;
    bool isBare_;
};

/// Returns the linked working trees of a repository, as findOtherWorkingTrees() does.
/// @param shared the folder of the repository, with a slash at its end
/// @throws LibGit2Exception if they cannot be listed
std::vector<WorkingTree> findLinkedWorkingTrees(const std::string &shared);

/// Returns all other working trees of the repository, as git lists them: libgit2 leaves out the
/// ones whose folders are gone, for example because they are on another disk.
/// @throws LibGit2Exception if they cannot be listed
std::vector<WorkingTree> findOtherWorkingTrees(git_repository *repository);

/// Returns true if another working tree has the branch checked out, or returns to it in the end.
/// libgit2 does not know if it cannot open the main working tree, for example another user's.
/// @throws LibGit2Exception if this cannot be found out
bool isCheckedOutElsewhere(git_repository *repository, const std::string &branch);

/// Refuses to switch branches while HEAD is a symbolic link: libgit2 would write the name of the
/// new branch into the file of the old one, whose commits would then be on no branch.
/// @throws LibGit2Exception
void refuseSwitchThroughLink(git_repository *repository);

/// Refuses to delete the branch that HEAD names as a symbolic link.
/// @param branch the full name
/// @throws LibGit2Exception
void refuseDeletionBehindLink(git_repository *repository, const std::string &branch);

/// Throws because another working tree has the branch checked out or needs it.
/// @param action what cannot be done with it
[[noreturn]] void raiseUsedElsewhere(const std::string &action, const std::string &branch);

} // namespace vclink::git
