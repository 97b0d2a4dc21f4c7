// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <map>
#include <string>

#include <git2/sys/merge.h>

namespace vclink::git
{

/// The merge drivers that a guard has registered, by name. libgit2 keeps the address of each
/// record. A move of the lookup does not change it, because a moved map keeps its nodes.
class GitMergeDriverLookup : public std::map<std::string, git_merge_driver>
{
};

/// Registers the only driver, as "*": libgit2 calls it for every name in a `merge` attribute for
/// which it has no driver. Keeps a driver that another guard has registered. Ignores the result of
/// git_merge_driver_register.
[[nodiscard]] GitMergeDriverLookup registerMergeDrivers();

/// Unregisters every driver of the lookup, for the whole process, even if another guard has
/// registered it. Ignores the result of git_merge_driver_unregister.
void unregisterMergeDrivers(GitMergeDriverLookup &lookup);

/// The driver's entry, which libgit2 calls in git_merge. Runs the command that the repository's
/// configuration has for "merge." + `filterName` + ".driver". Throws nothing: an exception is
/// stored in the thread's slot.
/// @return 0 if the command has merged the file; GIT_EMERGECONFLICT if it has not, or a side is
/// missing; GIT_PASSTHROUGH, for libgit2's own text merge, if there is no command; GIT_EUSER for an
/// exception
int wildcardApplyEntry(git_merge_driver *self, const char **pathOut, std::uint32_t *modeOut,
                       git_buf *mergedOut, const char *filterName,
                       const git_merge_driver_source *source) noexcept;

} // namespace vclink::git
