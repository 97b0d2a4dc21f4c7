// SPDX-License-Identifier: MIT
#include "main/files/mapStatusFlags.hpp"

#include <git2/status.h>

namespace vclink::git
{

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
