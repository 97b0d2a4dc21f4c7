// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include <git2/oid.h>
#include <git2/types.h>

namespace vclink::git
{

/// A tracked file or link that looks different from what the index has noted of it.
struct ChangedFile
{
    std::string path;
    /// The mode that Git has for what is there; GIT_FILEMODE_UNREADABLE if it is missing.
    std::uint32_t mode = 0;
    /// Whether both the entry and what is there, if anything, are files.
    bool isPlain = false;
    /// Whether a file is there that has no content.
    bool isEmpty = false;
};

/// The files and links of a working tree that an index may not have as they are. Looks at each of
/// them once, without reading it, when it is constructed. Not in it: conflicts, what a sparse
/// checkout leaves out, what is assumed unchanged, submodules, and what has become something else
/// than a file or link.
class ChangedFiles
{
  public:
    ChangedFiles(git_repository *repository, git_index *index);

    /// In the order of the index.
    const std::vector<ChangedFile> &files() const noexcept
    {
        return files_;
    }
    /// Whether the entry that libgit2 makes of a file may depend on which files it has staged
    /// before: a file with attributes is in conflict or cannot be examined, or a path has both a
    /// conflict and an entry without one.
    bool dependOnOrder() const noexcept
    {
        return dependOnOrder_;
    }

    /// Whether a file is in conflict.
    bool hasConflicts() const noexcept
    {
        return hasConflicts_;
    }

  private:
    std::vector<ChangedFile> files_;
    bool dependOnOrder_ = false;
    bool hasConflicts_ = false;
};

/// Whether a file with this path contains attributes.
bool isForAttributes(const std::string &path) noexcept;

} // namespace vclink::git
