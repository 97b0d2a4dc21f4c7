// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

#include <git2/index.h>
#include <git2/types.h>
#include <sys/stat.h>

#include "util/scope/FileDescriptor.hpp"

namespace vclink::git
{

/// Whether an entry of this mode is a file or a symbolic link.
bool isFileMode(std::uint32_t mode) noexcept;

/// Whether a file of this path holds attributes.
bool isForAttributes(std::string_view path) noexcept;

/// The files and links of a working tree that an index may not have as they are: they are missing,
/// or look different from what the index noted of them. Only looks at them, and reads none. Entries
/// in conflict and those that are not compared at all do not count.
class ChangedFiles
{
  public:
    /// @param workdir a folder; if it cannot be opened, no file counts as changed
    ChangedFiles(const char *workdir, git_index *index);

    /// Visits the entries in the index's order. The visitor may change entries, and must not add or
    /// remove any.
    template <class Visitor> void forEach(const Visitor &visit) const
    {
        const std::size_t count = git_index_entrycount(index_);
        for (std::size_t i = 0; i < count; ++i)
        {
            const git_index_entry &entry = *git_index_get_byindex(index_, i);
            if (isChanged(entry))
            {
                visit(entry);
            }
        }
    }

    bool isGone(const char *path) const;
    bool isOtherSize(const git_index_entry &entry) const;
    /// Whether a file is there that holds nothing.
    bool isEmptied(const git_index_entry &entry) const;
    /// Whether the entry could have been made in the second in which its file changed again.
    bool isRacy(const git_index_entry &entry) const noexcept;

  private:
    bool isChanged(const git_index_entry &entry) const;
    int look(const char *path, struct stat &status) const;

    FileDescriptor workdir_;
    git_index *index_;
    std::int32_t indexTime_ = 0;
};

} // namespace vclink::git
