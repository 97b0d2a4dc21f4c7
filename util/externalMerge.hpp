// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string>

#include <git2/sys/merge.h>

namespace vclink::git
{

/// The three versions of a file to merge, and libgit2's options for it. Points to libgit2's own
/// entries.
struct FileVersions
{
    explicit FileVersions(const git_merge_driver_source *source);

    bool areComplete() const noexcept
    {
        return ancestor != nullptr && ours != nullptr && theirs != nullptr;
    }

    /// Returns the path of the result: the changed one of ours, otherwise that of theirs. All sides
    /// must exist.
    const char *resultPath() const noexcept;
    /// Returns the mode of the result in the same way.
    std::uint32_t resultMode() const noexcept;

    const git_index_entry *ancestor;
    const git_index_entry *ours;
    const git_index_entry *theirs;
    const git_merge_file_options *options;
};

/// The result of a driver. Points to libgit2's own variables.
struct MergedFile
{
    const char **path;
    std::uint32_t *mode;
    git_buf *content;
};

/// Merges the sides by a command, which receives them in temporary files. Removes the files on
/// every way out.
/// @param command a template with the placeholders %O, %A, %B, %L and %P
/// @param sides all must exist
/// @param merged set if the command succeeds: to the content of the file of ours, and to the path
/// and mode of the result
/// @return 0, or GIT_EMERGECONFLICT if the command does not succeed
/// @throws LibGit2Exception if a blob cannot be read or the content cannot be passed to libgit2,
/// and what runCommand() throws
[[nodiscard]] int runExternalMerge(const std::string &command, const FileVersions &sides,
                                   git_repository *repository, const MergedFile &merged);

} // namespace vclink::git
