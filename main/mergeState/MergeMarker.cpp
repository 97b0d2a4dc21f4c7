// SPDX-License-Identifier: MIT
#include "main/mergeState/MergeMarker.hpp"

#include <cerrno>
#include <cstddef>

#include <git2/oid.h>
#include <git2/repository.h>
#include <unistd.h>

#include "error/errorUtil/raiseSystemError.hpp"
#include "util/repository/objectIds.hpp"
#include "util/scope/newFile.hpp"
#include "util/scope/wholeFile.hpp"

namespace vclink::git
{
namespace
{

constexpr std::size_t idLineSize = idTextSize + 1;
constexpr std::size_t markerSize = 2 * idLineSize;

std::string markerPath(git_repository *repository)
{
    return git_repository_path(repository) + std::string("vclink-merge");
}

std::string lineOf(const git_oid &id)
{
    std::string line(idLineSize, '\n');
    git_oid_fmt(line.data(), &id);
    return line;
}

/// After a power failure, a file can have NUL bytes in place of its content.
bool isIdLine(const std::string &line)
{
    return line.find_first_not_of("0123456789abcdef") == idTextSize && line.back() == '\n';
}

/// Returns the id and the line end of such a file, empty if there is none.
std::string readIdLine(const std::string &path)
{
    std::string line;
    return readWholeFile(path, line) == 0 ? line.substr(0, idLineSize) : std::string();
}

} // namespace

MergeMarker::MergeMarker(git_repository *repository, const MergeSides &sides)
    : repository_(repository), path_(markerPath(repository)),
      autoMergePath_(git_repository_path(repository) + std::string("AUTO_MERGE")),
      autoMerge_(readIdLine(autoMergePath_))
{
    removeMergeMarker(repository);
    const int error = createFile(path_, lineOf(sides.ours) + lineOf(sides.theirs));
    if (error != 0)
    {
        raiseSystemError(error, "could not write '" + path_ + "'");
    }
    // libgit2 leaves it when it ends a merge.
    ::unlink(autoMergePath_.c_str());
}

MergeMarker::~MergeMarker()
{
    ::unlink(path_.c_str());
    if (!autoMerge_.empty() && git_repository_state(repository_) == GIT_REPOSITORY_STATE_NONE)
    {
        static_cast<void>(createFile(autoMergePath_, autoMerge_));
    }
}

bool hasMergeMarker(git_repository *repository, const git_oid &theirs)
{
    const std::string path = markerPath(repository);
    std::string text;
    const int error = readWholeFile(path, text);
    if (error == ENOENT)
    {
        return false;
    }
    if (error != 0)
    {
        raiseSystemError(error, "could not read '" + path + "'");
    }
    const std::string line = text.size() == markerSize ? text.substr(idLineSize) : std::string();
    return !isIdLine(line) || line == lineOf(theirs);
}

void removeMergeMarker(git_repository *repository) noexcept
{
    // A failed allocation leaves it for the next time.
    try
    {
        ::unlink(markerPath(repository).c_str());
    }
    catch (...)
    {
    }
}

} // namespace vclink::git
