// SPDX-License-Identifier: MIT
#include "main/files/HeldEntries.hpp"

#include <cstddef>
#include <cstdint>

#include <git2/index.h>

namespace vclink::git
{
namespace
{

/// git_index_add would also remove entries that collide with this one, as `a` and `a/b` do, and
/// make libgit2 write the trees above it again. libgit2 declares its entries read-only. Its order
/// and its look-ups do not use this flag.
void setAssumedUnchanged(const git_index_entry *entry, bool isAssumed) noexcept
{
    if (entry != nullptr)
    {
        auto &flags = const_cast<git_index_entry *>(entry)->flags;
        flags = static_cast<std::uint16_t>(isAssumed ? flags | GIT_INDEX_ENTRY_VALID
                                                     : flags & ~GIT_INDEX_ENTRY_VALID);
    }
}

bool isLeftOut(const git_index_entry &entry)
{
    return GIT_INDEX_ENTRY_STAGE(&entry) == GIT_INDEX_STAGE_NORMAL &&
           (entry.flags_extended & GIT_INDEX_ENTRY_SKIP_WORKTREE) != 0 &&
           (entry.flags & GIT_INDEX_ENTRY_VALID) == 0;
}

} // namespace

void HeldEntries::hold(git_index *index, const std::string &path)
{
    paths_.push_back(path);
    setAssumedUnchanged(git_index_get_bypath(index, path.c_str(), GIT_INDEX_STAGE_NORMAL), true);
}

void HeldEntries::holdLeftOut(git_index *index)
{
    const std::size_t count = git_index_entrycount(index);
    for (std::size_t i = 0; i < count; ++i)
    {
        const git_index_entry *const entry = git_index_get_byindex(index, i);
        if (isLeftOut(*entry))
        {
            paths_.emplace_back(entry->path);
            setAssumedUnchanged(entry, true);
        }
    }
}

void HeldEntries::giveBack(git_index *index) noexcept
{
    for (const std::string &path : paths_)
    {
        setAssumedUnchanged(git_index_get_bypath(index, path.c_str(), GIT_INDEX_STAGE_NORMAL),
                            false);
    }
    paths_.clear();
}

} // namespace vclink::git
