// SPDX-License-Identifier: MIT
#pragma once

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"
#include "vclink/FileState.hpp"
#include "vclink/FileStateMap.hpp"

namespace vclink::git
{

/// Collects the states of one status walk.
class StatusCallbacks
{
  public:
    explicit StatusCallbacks(const upath &walkRoot);

    /// Notes the state of one file. The first report of a path counts. git_status_cb.
    /// @param path relative to the repository's root
    /// @param flags git_status_t bits
    /// @return 0, so that the walk continues
    int status(const char *path, unsigned int flags);

    upath root;
    FileStateMap states;

  private:
    ustring nameBuffer_;
};

} // namespace vclink::git
