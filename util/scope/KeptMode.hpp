// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "util/scope/FileDescriptor.hpp"

namespace vclink::git
{

/// Keeps the mode of a file that libgit2 replaces in the scope. libgit2 writes a configuration file
/// as a new file with the default mode, so that everybody could read the secrets in it. Between the
/// replacement and the end of the scope the file has the default mode.
///
/// Does nothing if the file does not exist or is not replaced. Ignores a failure to set the mode.
class KeptMode
{
  public:
    /// @param path a link means its target
    [[nodiscard]] explicit KeptMode(std::string path);
    KeptMode(const KeptMode &) = delete;
    KeptMode &operator=(const KeptMode &) = delete;
    ~KeptMode();

  private:
    std::string path_;
    /// Open, so that no new file gets its inode.
    FileDescriptor before_;
};

} // namespace vclink::git
