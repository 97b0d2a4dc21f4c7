// SPDX-License-Identifier: MIT
#include "main/mergeState/unfinishedOperation.hpp"

#include <cerrno>
#include <cstdlib>
#include <string>

#include <git2/errors.h>
#include <git2/repository.h>
#include <unistd.h>

#include "error/errorUtil/raiseGitError.hpp"
#include "error/errorUtil/raiseSystemError.hpp"
#include "util/repository/repository.hpp"
#include "util/repository/workingTrees.hpp"
#include "util/scope/wholeFile.hpp"

namespace vclink::git
{
namespace
{

/// Returns null if a switch does no harm.
const char *describe(int state)
{
    switch (state)
    {
    case GIT_REPOSITORY_STATE_NONE:
    case GIT_REPOSITORY_STATE_BISECT:
        return nullptr;
    case GIT_REPOSITORY_STATE_MERGE:
        return "a merge";
    case GIT_REPOSITORY_STATE_REVERT:
    case GIT_REPOSITORY_STATE_REVERT_SEQUENCE:
        return "a revert";
    case GIT_REPOSITORY_STATE_CHERRYPICK:
    case GIT_REPOSITORY_STATE_CHERRYPICK_SEQUENCE:
        return "a cherry-pick";
    case GIT_REPOSITORY_STATE_REBASE:
    case GIT_REPOSITORY_STATE_REBASE_INTERACTIVE:
    case GIT_REPOSITORY_STATE_REBASE_MERGE:
    case GIT_REPOSITORY_STATE_APPLY_MAILBOX_OR_REBASE:
        return "a rebase";
    case GIT_REPOSITORY_STATE_APPLY_MAILBOX:
        return "an application of patches";
    default:
        return "an operation";
    }
}

/// Returns true if git has put changes of the user aside, or if that cannot be examined. After a
/// squash, no operation is under way then.
bool hasAutostash(git_repository *repository)
{
    const std::string folder = git_repository_path(repository);
    for (const char *const file :
         {"MERGE_AUTOSTASH", "rebase-merge/autostash", "rebase-apply/autostash"})
    {
        if (::access((folder + file).c_str(), F_OK) == 0 || (errno != ENOENT && errno != ENOTDIR))
        {
            return true;
        }
    }
    return false;
}

/// Returns the number in a file of `git am`, or 0 if it has none.
unsigned long readNumber(const std::string &path)
{
    std::string text;
    const int error = readWholeFile(path, text);
    if (error != 0 && error != ENOENT)
    {
        raiseSystemError(error, "could not read '" + path + "'");
    }
    return std::strtoul(text.c_str(), nullptr, 10);
}

bool isNeeded(const WorkingTree &tree, const std::string &branch)
{
    return tree.returnsTo(branch) || tree.moves(branch);
}

} // namespace

void refuseSwitchInUnfinishedOperation(git_repository *repository)
{
    const char *operation = describe(readRepositoryState(repository));
    if (operation == nullptr && isInSeries(repository))
    {
        operation = "a series of cherry-picks or reverts";
    }
    if (operation != nullptr)
    {
        raiseGitError(GIT_ECONFLICT, GIT_ERROR_CHECKOUT,
                      std::string("cannot switch branches while ") + operation +
                          " is under way: conclude or abort it first, see git status");
    }
    if (hasAutostash(repository))
    {
        raiseGitError(GIT_ECONFLICT, GIT_ERROR_CHECKOUT,
                      "cannot switch branches while uncommitted changes are put aside, because "
                      "only git brings them back (--autostash): conclude the merge with 'git "
                      "commit', or use 'git switch', which moves them to the stash");
    }
}

void refuseCommitWithAutostash(git_repository *repository)
{
    if (hasAutostash(repository))
    {
        raiseGitError(GIT_ERROR, GIT_ERROR_REPOSITORY,
                      "'git merge' or 'git rebase' has put uncommitted changes aside "
                      "(--autostash), and only git brings them back: conclude it with 'git commit' "
                      "or 'git rebase --continue'");
    }
}

void refuseCommitWithPatches(git_repository *repository, int state)
{
    if (state != GIT_REPOSITORY_STATE_APPLY_MAILBOX)
    {
        return;
    }
    const std::string folder = git_repository_path(repository) + std::string("rebase-apply/");
    if (readNumber(folder + "next") < readNumber(folder + "last"))
    {
        raiseGitError(GIT_ERROR, GIT_ERROR_REPOSITORY,
                      "'git am' has more patches to apply, and the commit would delete them: "
                      "continue with 'git am --continue', or end it with 'git am --abort' or 'git "
                      "am --quit'");
    }
}

void refuseDeletionInUnfinishedOperation(git_repository *repository, const char *reference)
{
    const std::string branch = reference;
    if (isNeeded(WorkingTree(git_repository_path(repository)), branch))
    {
        raiseGitError(GIT_ERROR, GIT_ERROR_REFERENCE,
                      "cannot delete '" + branch +
                          "', which a rebase or bisection needs: conclude or abort it first, see "
                          "git status");
    }
    for (const WorkingTree &tree : findOtherWorkingTrees(repository))
    {
        if (tree.hasCheckedOut(branch) || isNeeded(tree, branch))
        {
            raiseUsedElsewhere("delete", branch);
        }
    }
}

} // namespace vclink::git
