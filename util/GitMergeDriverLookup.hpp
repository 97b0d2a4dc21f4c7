// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <map>
#include <string>

#include <git2/sys/merge.h>

namespace vclink::git
{

/// The merge drivers that a guard has registered, by name. libgit2 keeps the address of each
/// record, which stays the same when the lookup is moved, since a moved map keeps its nodes.
class GitMergeDriverLookup : public std::map<std::string, git_merge_driver>
{
};

/// Registers the one driver, under "*": libgit2 calls it for every name in a `merge` attribute that
/// it knows no driver for. A driver that is registered already, by another guard, stays.
/// git_merge_driver_register, whose result is not looked at.
[[nodiscard]] GitMergeDriverLookup registerMergeDrivers();

/// Unregisters every driver of the lookup, for the whole process, also when another guard has
/// registered it. git_merge_driver_unregister, whose result is not looked at.
void unregisterMergeDrivers(GitMergeDriverLookup &lookup);

/// The driver's entry, called by libgit2 within git_merge. Runs the command that the repository's
/// configuration has under "merge." + `filterName` + ".driver". No exception leaves it: one is
/// parked in the thread's slot.
/// @return 0 when the command has merged the file; GIT_EMERGECONFLICT when it has not, or a side is
/// missing; GIT_PASSTHROUGH, which asks for libgit2's own text merge, when there is no command;
/// GIT_EUSER for an exception
int wildcardApplyEntry(git_merge_driver *self, const char **pathOut, std::uint32_t *modeOut,
                       git_buf *mergedOut, const char *filterName,
                       const git_merge_driver_source *source) noexcept;

} // namespace vclink::git
