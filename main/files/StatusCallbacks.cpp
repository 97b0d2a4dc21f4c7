// SPDX-License-Identifier: MIT
#include "main/files/StatusCallbacks.hpp"

#include <git2/status.h>

#include "util/path/paths.hpp"

namespace vclink::git
{
namespace
{

constexpr unsigned int statusWord = 0xFFFF;

} // namespace

StatusCallbacks::StatusCallbacks(const upath &walkRoot) : root(walkRoot)
{
}

int StatusCallbacks::status(const char *path, unsigned int flags)
{
    // libgit2 reports in byte order, which is nearly the map's: the end is a good guess of where
    // the path belongs, and a wrong one costs a look-up.
    states.emplace_hint(states.end(), joinRepositoryPath(root, path, nameBuffer_),
                        FileState(mapStatusFlags(flags & statusWord)));
    return 0;
}

FileState::State mapStatusFlags(unsigned int flags) noexcept
{
    if (flags == GIT_STATUS_CURRENT)
    {
        return FileState::Clean;
    }
    if ((flags & GIT_STATUS_CONFLICTED) != 0)
    {
        return FileState::InConflict;
    }
    if ((flags & GIT_STATUS_INDEX_NEW) != 0)
    {
        return FileState::Added;
    }
    if ((flags & (GIT_STATUS_INDEX_MODIFIED | GIT_STATUS_WT_MODIFIED)) != 0)
    {
        return FileState::Modified;
    }
    if ((flags & GIT_STATUS_INDEX_DELETED) != 0)
    {
        return FileState::Deleted;
    }
    if ((flags & GIT_STATUS_WT_NEW) != 0)
    {
        return FileState::Unversioned;
    }
    if ((flags & GIT_STATUS_WT_DELETED) != 0)
    {
        return FileState::Missing;
    }
    return FileState::Unknown;
}

} // namespace vclink::git
