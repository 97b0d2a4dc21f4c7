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

/// The one state that a file's git_status_t bits come down to. The order of the tests decides: a
/// conflict beats everything, new in the index beats edited since, changed in the index beats gone
/// from the working tree, removed from the index beats still on disk.
FileState::State mapStatusFlags(unsigned int flags) noexcept;

} // namespace vclink::git
