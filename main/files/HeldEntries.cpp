// SPDX-License-Identifier: MIT
#include "main/files/HeldEntries.hpp"

#include <cstddef>

namespace vclink::git
{

bool isLeftOut(const git_index_entry &entry) noexcept
{
    return (entry.flags_extended & GIT_INDEX_ENTRY_SKIP_WORKTREE) != 0;
}

bool isAssumedUnchanged(const git_index_entry &entry) noexcept
{
    return (entry.flags & GIT_INDEX_ENTRY_VALID) != 0;
}

GitResult<void> HeldEntries::hold(git_index *index, const git_index_entry &entry)
{
    entries_.push_back({entry.path, entry});
    git_index_entry held = entry;
    held.flags |= GIT_INDEX_ENTRY_VALID;
    return call(git_index_add, index, &held);
}

GitResult<void> HeldEntries::holdLeftOut(git_index *index)
{
    const std::size_t count = git_index_entrycount(index);
    for (std::size_t i = 0; i < count; ++i)
    {
        const git_index_entry *const entry = git_index_get_byindex(index, i);
        if (isLeftOut(*entry) && !isAssumedUnchanged(*entry) &&
            GIT_INDEX_ENTRY_STAGE(entry) == GIT_INDEX_STAGE_NORMAL)
        {
            GitResult<void> held = hold(index, *entry);
            if (held.has_error())
            {
                return held;
            }
        }
    }
    return boost::outcome_v2::success();
}

void HeldEntries::giveBack(git_index *index) const
{
    for (const Held &held : entries_)
    {
        git_index_entry entry = held.entry;
        entry.path = held.path.c_str();
        check(git_index_add, index, &entry);
    }
}

void HeldEntries::readAgain(git_index *index)
{
    entries_.clear();
    check(git_index_read, index, int{true});
}

} // namespace vclink::git
