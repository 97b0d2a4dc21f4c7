// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string>

#include <git2/sys/merge.h>

namespace vclink::git
{

/// The three versions of a file that is merged, and how libgit2 would merge it. Points into
/// libgit2's own entries.
struct FileVersions
{
    explicit FileVersions(const git_merge_driver_source *source);

    bool areComplete() const noexcept
    {
        return ancestor != nullptr && ours != nullptr && theirs != nullptr;
    }

    /// The path that ours has given the file, otherwise theirs. For complete sides.
    const char *resultPath() const noexcept;
    /// The mode, likewise.
    std::uint32_t resultMode() const noexcept;

    const git_index_entry *ancestor;
    const git_index_entry *ours;
    const git_index_entry *theirs;
    const git_merge_file_options *options;
};

/// Where a driver leaves the merged file. libgit2's own.
struct MergedFile
{
    const char **path;
    std::uint32_t *mode;
    git_buf *content;
};

/// Has a command merge the sides, which it finds in temporary files; these are removed on every way
/// out.
/// @param command a template with the placeholders %O, %A, %B, %L and %P
/// @param sides complete ones
/// @param merged set when the command succeeds: to what it has left in the file of ours, and to the
/// path and mode of the result
/// @return 0, or GIT_EMERGECONFLICT when the command does not succeed
/// @throws LibGit2Exception when a blob can't be read or the content not be handed over, and what
/// runCommand() raises
[[nodiscard]] int runExternalMerge(const std::string &command, const FileVersions &sides,
                                   git_repository *repository, const MergedFile &merged);

} // namespace vclink::git
