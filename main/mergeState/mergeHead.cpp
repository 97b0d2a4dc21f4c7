// SPDX-License-Identifier: MIT
#include "main/mergeState/mergeHead.hpp"

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
#include "util/scope/wholeFile.hpp"

namespace vclink::git
{
namespace
{

std::string mergeHeadPath(git_repository *repository)
{
    return git_repository_path(repository) + std::string("MERGE_HEAD");
}

} // namespace

void restoreMergeHead(git_repository *repository, const git_oid &theirs)
{
    const std::string path = mergeHeadPath(repository);
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

void refuseDamagedMergeHead(git_repository *repository)
{
    const std::string path = mergeHeadPath(repository);
    std::string text;
    const int error = readWholeFile(path, text);
    if (error != 0)
    {
        raiseSystemError(error, "could not read '" + path + "'");
    }
    if (text.find('\0') != std::string::npos)
    {
        raiseGitError(GIT_ERROR, GIT_ERROR_MERGE,
                      "MERGE_HEAD is damaged, and the commit would lack the history of the other "
                      "side: write the id of the merged commit into '" +
                          path + "', or abort the merge with 'git merge --abort'");
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
