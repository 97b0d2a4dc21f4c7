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

/// Makes paths relative to one root. Resolves the root once, at construction, and each folder of
/// the paths once. Use it for one operation on one thread, because it keeps what it has resolved.
class RootRelativePaths
{
  public:
    /// @throws boost::filesystem::filesystem_error if the root cannot be resolved
    explicit RootRelativePaths(const upath &root);

    /// Returns what boost::filesystem::relative returns for `path` and the root, with forward
    /// slashes, in UTF-8. Symbolic links in the existing part of both are resolved. The result is
    /// "." for the root itself, begins with ".." for a path outside, and is empty if the path
    /// cannot be related to the root (an empty path, or a relative one of which nothing exists).
    /// @throws boost::filesystem::filesystem_error if the path cannot be resolved
    std::string relative(const upath &path);

  private:
    /// Returns nothing for a folder that is not the root or below it.
    using FolderBelowRoot = boost::optional<std::string>;
    std::string resolve(const std::string &path);
    const FolderBelowRoot &findFolder(const std::string &folder);

    std::string given_;
    boost::filesystem::path root_;
    std::unordered_map<std::string, FolderBelowRoot> folders_;
};

/// Returns one path relative to `root`; see RootRelativePaths::relative.
/// @throws boost::filesystem::filesystem_error
ustring relativeToRoot(const upath &root, const upath &path);

/// Returns the root with a name appended that Git reported. An empty name returns the root.
/// @param name relative to the root, UTF-8 or any other bytes, never null
upath joinRepositoryPath(const upath &root, const char *name);

/// The same for many names. Converts each name into `buffer`, whose memory is used for the next
/// one.
upath joinRepositoryPath(const upath &root, const char *name, ustring &buffer);

} // namespace vclink::git
