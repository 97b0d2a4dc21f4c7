// SPDX-License-Identifier: MIT
#include "main/mergeState/mergeHead.hpp"

#include <cerrno>
#include <string>

#include <fcntl.h>
#include <git2/commit.h>
#include <git2/errors.h>
#include <git2/oid.h>
#include <git2/repository.h>
#include <sys/stat.h>
#include <unistd.h>

#include "error/errorUtil/raiseGitError.hpp"
#include "error/errorUtil/raiseSystemError.hpp"
#include "util/repository/objectIds.hpp"
#include "util/scope/FileDescriptor.hpp"

namespace vclink::git
{

void restoreMergeHead(git_repository *repository, const git_oid &theirs)
{
    const std::string path = git_repository_path(repository) + std::string("MERGE_HEAD");
    std::string line(idTextSize + 1, '\n');
    git_oid_fmt(line.data(), &theirs);
    const FileDescriptor file(
        ::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, DEFFILEMODE));
    if (!file && errno == EEXIST)
    {
        return;
    }
    if (!file || ::write(file.get(), line.data(), line.size()) != static_cast<ssize_t>(line.size()))
    {
        const int error = errno;
        ::unlink(path.c_str());
        raiseSystemError(error, "could not write '" + path + "'");
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
