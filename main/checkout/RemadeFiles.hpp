// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

namespace vclink::git
{

/// Returns true for a file with further names, or that cannot be opened for writing.
/// @param path absolute
bool mustBeRemade(const std::string &path);

/// The files that a checkout overwrites, and creates again, as git does. libgit2 writes into the
/// existing file. If it has other names, it changes under all of them, even in other folders. If it
/// cannot be opened for writing, because it is read-only, another user's or a running program,
/// libgit2 stops in the middle of its writing.
class RemadeFiles
{
  public:
    /// Notes a file if it must be created again. Call it for each file before the checkout writes
    /// the first one.
    /// @param path absolute; if there is no file, only the folders above are looked at
    /// @param isExecutable what the checkout makes of it
    /// @return empty, or why the checkout cannot write the file
    /// @throws LibGit2Exception if the path cannot be examined
    std::string note(const std::string &path, bool isExecutable);

    /// Removes the noted files. Call it right before the checkout writes.
    void remove() noexcept;

  private:
    bool isCreatable(const std::string &path);

    /// The folder that was looked at last, and what came out.
    std::string folder_;
    bool isFolderWritable_ = true;
    std::vector<std::string> paths_;
};

} // namespace vclink::git
