// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/strarray.h>

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"

namespace vclink::git
{

/// Owner of a git_strarray and of its strings. Points into itself, so it is neither copied nor
/// moved; libgit2 only borrows it, for one call.
class PathspecArray
{
  public:
    explicit PathspecArray(std::vector<std::string> strings);
    PathspecArray(const PathspecArray &) = delete;
    PathspecArray &operator=(const PathspecArray &) = delete;
    ~PathspecArray() = default;

    /// The record: a null pointer and 0 for an empty list.
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

/// For a field of an option record. Its pointers are valid as long as the array.
git_strarray getArray(const PathspecArray &pathspec) noexcept;

/// One entry a file, in the list's order: its path relative to the root, UTF-8. The characters '*',
/// '?' and '[' in a name act as patterns; whatever else libgit2 would not read as the name it is,
/// is escaped. An entry that would mean everything matches nothing instead.
/// @throws boost::filesystem::filesystem_error when a path can't be resolved
PathspecArray makeFilePathspec(const std::vector<upath> &files, const upath &root);

/// Each text as it stands, UTF-8, in the list's order: refspecs, paths that are relative already.
PathspecArray makeStringPathspec(const std::vector<ustring> &texts);

/// One entry that means all below `folder`: "*" for the root.
/// @throws boost::filesystem::filesystem_error when the folder can't be resolved
PathspecArray makeFolderPathspec(const upath &folder, const upath &root);

} // namespace vclink::git
