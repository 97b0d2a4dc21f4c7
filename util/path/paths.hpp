// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <unordered_map>

#include <boost/filesystem/path.hpp>
#include <boost/optional/optional.hpp>

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"

namespace vclink::git
{

/// Makes paths relative to one root. The root is resolved once, at construction, and each folder
/// that the paths lie in once. For one operation on one thread: what was resolved is kept, and is
/// not looked at again.
class RootRelativePaths
{
  public:
    /// @throws boost::filesystem::filesystem_error when the root can't be resolved
    explicit RootRelativePaths(const upath &root);

    /// What boost::filesystem::relative gives of `path` and the root, with forward slashes, in
    /// UTF-8: symbolic links in the existing part of either are resolved. "." for the root itself,
    /// a leading ".." for a path outside, empty where the two can't be related (an empty path, a
    /// relative one of which nothing exists).
    /// @throws boost::filesystem::filesystem_error when it can't be resolved
    std::string relative(const upath &path);

  private:
    /// Nothing for a folder that does not lie at or below the root.
    using FolderBelowRoot = boost::optional<std::string>;
    std::string resolve(const std::string &path);
    const FolderBelowRoot &findFolder(const std::string &folder);

    std::string given_;
    boost::filesystem::path root_;
    std::unordered_map<std::string, FolderBelowRoot> folders_;
};

/// One path relative to `root`; see RootRelativePaths::relative.
/// @throws boost::filesystem::filesystem_error
ustring relativeToRoot(const upath &root, const upath &path);

/// The root with a name that Git reported appended; an empty name gives the root.
/// @param name relative to the root, UTF-8 or any other bytes, never null
upath joinRepositoryPath(const upath &root, const char *name);

/// The same, for many names: the converted name is put into `buffer`, whose room serves the next.
upath joinRepositoryPath(const upath &root, const char *name, ustring &buffer);

} // namespace vclink::git
