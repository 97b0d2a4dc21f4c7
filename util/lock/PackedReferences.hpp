// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <git2/types.h>
#include <sys/stat.h>

#include "error/errorUtil/GitResult.hpp"

namespace vclink::git
{

/// The file of packed references, and git's lock for it. While it is locked, no other process packs
/// loose references. A process that has begun to pack a reference writes it even if another process
/// has deleted it since. To delete one, git keeps the lock until the loose reference is gone.
/// libgit2 locks the file only while it writes it, so look again under the lock after a deletion.
class PackedReferences
{
  public:
    /// Does not lock.
    explicit PackedReferences(git_repository *repository);
    PackedReferences(const PackedReferences &) = delete;
    PackedReferences &operator=(const PackedReferences &) = delete;
    /// Releases the lock.
    ~PackedReferences();

    /// Locks the file, which must not be locked by this object.
    /// @return the code GIT_ELOCKED if another process holds the lock
    /// @throws LibGit2Exception if the lock cannot be created
    GitResult<void> lock();
    /// Notes the file, and releases the lock.
    void release() noexcept;
    /// Returns true if the file has changed since release().
    [[nodiscard]] bool haveChanged() const noexcept;

  private:
    [[nodiscard]] struct stat status() const noexcept;

    std::string path_;
    std::string lock_;
    bool isLocked_ = false;
    struct stat noted_ = {};
};

} // namespace vclink::git
