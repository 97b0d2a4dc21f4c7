// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <sys/stat.h>

#include "util/scope/FileDescriptor.hpp"

namespace vclink::git
{

/// How precise the time of an index is.
enum class IndexTime
{
    /// The whole second, so that libgit2 treats entries of that second as racy, as git does, which
    /// usually ignores fractions. Otherwise libgit2 would not mark an edit in that second, and git
    /// would never see it.
    Second,
    /// With its fraction, so that libgit2 does not compare again the content of files that it has
    /// just written. The caller marks edits in that second.
    Fraction
};

/// A copy of an index file in the same folder. libgit2 works on it while the caller holds the index
/// lock. libgit2 replaces the file when it writes the index, so the object can tell whether it has.
class IndexCopy
{
  public:
    /// Copies the file and its modification time. Makes no copy if there is no index: libgit2
    /// recognises the first checkout of a repository by that. Removes an earlier copy of a killed
    /// operation.
    /// @param index the path of the index file, not a symbolic link
    /// @throws LibGit2Exception if the file cannot be read or copied; then there is no copy
    [[nodiscard]] IndexCopy(const std::string &index, IndexTime time);
    IndexCopy(const IndexCopy &) = delete;
    IndexCopy &operator=(const IndexCopy &) = delete;
    /// Removes the copy if it still exists.
    ~IndexCopy();

    const std::string &path() const noexcept
    {
        return path_;
    }

    /// Replaces the index by the copy, in one step, if libgit2 has written it.
    /// @return 0, or the errno of the call that failed
    [[nodiscard]] int replaceIndex() const noexcept;

  private:
    IndexCopy(std::string index, std::string path);
    void copyFrom(const FileDescriptor &source, IndexTime time);
    void copyContent(const FileDescriptor &source, std::size_t size) const;

    std::string index_;
    std::string path_;
    /// Stays open, so that no file that libgit2 writes gets the inode number of the first copy.
    FileDescriptor copy_;
    struct stat copied_ = {};
};

} // namespace vclink::git
