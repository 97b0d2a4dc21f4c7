// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/strarray.h>

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"

namespace vclink::git
{

/// Owns a git_strarray and its strings. Contains pointers to itself, so it cannot be copied or
/// moved. libgit2 only borrows it, for one call.
class PathspecArray
{
  public:
    explicit PathspecArray(std::vector<std::string> strings);
    PathspecArray(const PathspecArray &) = delete;
    PathspecArray &operator=(const PathspecArray &) = delete;
    ~PathspecArray() = default;

    /// The record. An empty list has a null pointer and 0.
    const git_strarray &array() const noexcept
    {
        return array_;
    }

  private:
    std::vector<std::string> strings_;
    std::vector<char *> pointers_;
    git_strarray array_;
};

/// For git_index_add_all, git_index_remove_all, git_reset_default. Valid as long as the array.
const git_strarray *getArrayPointer(const PathspecArray &pathspec) noexcept;

/// Returns a value for a field of an option record. Its pointers are valid as long as the array.
git_strarray getArray(const PathspecArray &pathspec) noexcept;

/// Creates one entry for each file, in the list's order: its path relative to the root, UTF-8. The
/// characters '*', '?' and '[' in a name act as patterns. Everything else that libgit2 would not
/// read literally is escaped. An entry that would mean everything matches nothing instead.
/// @throws boost::filesystem::filesystem_error if a path cannot be resolved
PathspecArray makeFilePathspec(const std::vector<upath> &files, const upath &root);

/// Creates an entry for each text, unchanged, UTF-8, in the list's order: for refspecs, and for
/// paths that are already relative.
PathspecArray makeStringPathspec(const std::vector<ustring> &texts);

/// Creates one entry that means everything below `folder`: "*" for the root.
/// @throws boost::filesystem::filesystem_error if the folder cannot be resolved
PathspecArray makeFolderPathspec(const upath &folder, const upath &root);

} // namespace vclink::git
