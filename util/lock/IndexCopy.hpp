// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <sys/stat.h>

#include "util/scope/FileDescriptor.hpp"

namespace vclink::git
{

/// A copy of an index file beside it, for libgit2 to work on while the caller holds the index's
/// lock. libgit2 replaces the file when it writes the index; that shows whether it has.
class IndexCopy
{
  public:
    /// Copies the file with the second of its modification time. Entries of that second count as
    /// racy then, to libgit2 as they do to a git that compares no fractions, as it is usually
    /// built: else libgit2 would not mark an edit of that second, and git never see it. Without an
    /// index there is no copy either: libgit2 knows the first checkout of a repository by that.
    /// Removes an earlier copy that a killed operation has left.
    /// @param index its path, no symbolic link
    /// @throws LibGit2Exception if the file can't be read or copied; there is no copy then
    [[nodiscard]] explicit IndexCopy(const std::string &index);
    IndexCopy(const IndexCopy &) = delete;
    IndexCopy &operator=(const IndexCopy &) = delete;
    /// Removes the copy if it is still there.
    ~IndexCopy();

    const std::string &path() const noexcept
    {
        return path_;
    }

    /// Puts the copy in the index's place, in one step, if libgit2 has written it.
    /// @return 0, or the errno of the call that failed
    [[nodiscard]] int replaceIndex() const noexcept;

  private:
    IndexCopy(std::string index, std::string path);
    void copyFrom(const FileDescriptor &source);
    void copyContent(const FileDescriptor &source, std::size_t size) const;

    std::string index_;
    std::string path_;
    /// Open to the end, so that no file that libgit2 writes gets the first copy's number.
    FileDescriptor copy_;
    struct stat copied_ = {};
};

} // namespace vclink::git
