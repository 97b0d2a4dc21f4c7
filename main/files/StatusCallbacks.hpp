// SPDX-License-Identifier: MIT
#pragma once

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"
#include "vclink/FileState.hpp"
#include "vclink/FileStateMap.hpp"

namespace vclink::git
{

/// What one status walk collects.
class StatusCallbacks
{
  public:
    explicit StatusCallbacks(const upath &walkRoot);

    /// Notes the state of one file; the first report of a path stands. git_status_cb.
    /// @param path relative to the repository's root
    /// @param flags git_status_t bits
    /// @return 0, so that the walk goes on
    int status(const char *path, unsigned int flags);

    upath root;
    FileStateMap states;

  private:
    ustring nameBuffer_;
};

} // namespace vclink::git
