// SPDX-License-Identifier: MIT
#include "main/mergeState/mergeHead.hpp"

#include <cerrno>
#include <string>

#include <git2/commit.h>
#include <git2/errors.h>
#include <git2/oid.h>
#include <git2/repository.h>

#include "error/errorUtil/raiseGitError.hpp"
#include "error/errorUtil/raiseSystemError.hpp"
#include "util/repository/objectIds.hpp"
#include "util/repository/repository.hpp"
#include "util/scope/newFile.hpp"

namespace vclink::git
{

void restoreMergeHead(git_repository *repository, const git_oid &theirs)
{
    const std::string path = git_repository_path(repository) + std::string("MERGE_HEAD");
    std::string line(idTextSize + 1, '\n');
    git_oid_fmt(line.data(), &theirs);
    const int error = createFile(path, line);
    if (error != 0 && error != EEXIST)
    {
        raiseSystemError(error, "could not write '" + path + "'");
    }
}

void refuseCommitWithoutMergeHead(git_repository *repository, int state)
{
    if (state != GIT_REPOSITORY_STATE_MERGE && hasMergeHead(repository))
    {
        raiseGitError(GIT_ERROR, GIT_ERROR_REPOSITORY,
                      "'git rebase' has stopped at a merge, and the commit would lack the history "
                      "of the other side: conclude the merge with 'git commit', or the rebase with "
                      "'git rebase --continue'");
    }
}

void refuseOtherParents(const MergeSides &merge, const std::vector<const git_commit *> &parents)
{
    const bool isOfMerge = parents.size() == 2 &&
                           isSameId(*git_commit_id(parents.front()), merge.ours) &&
                           isSameId(*git_commit_id(parents.back()), merge.theirs);
    if (!isOfMerge)
    {
        raiseGitError(GIT_EMODIFIED, GIT_ERROR_MERGE,
                      "the merge was not committed, because another process has moved the current "
                      "branch or ended the merge meanwhile: see git status");
    }
}

} // namespace vclink::git
