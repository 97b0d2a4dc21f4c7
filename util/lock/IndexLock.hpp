// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <memory>

#include <git2/types.h>

#include "util/lock/IndexCopy.hpp"

namespace vclink::git
{

/// Holds git's own index lock, `index.lock`, from before the index is read until the new one is in
/// place, so that no other process changes it in between. libgit2 itself locks the index only while
/// it writes the file. Until then the repository works on a private copy: libgit2 writes the
/// repository's index to it, also in a checkout or a merge.
///
/// For one operation on one thread.
class IndexLock
{
  public:
    /// Acquires the lock, and gives the repository its copy of the index. git_index_open,
    /// git_repository_set_index, git_index_set_caps.
    /// @param repository outlives the object; must not use its index after publish()
    /// @param patience how long to try again if something else holds the lock; git does not
    /// @throws LibGit2Exception with the code GIT_ELOCKED and the name of the lock file if
    /// something else holds the lock; then nothing has changed
    [[nodiscard]] explicit IndexLock(
        git_repository *repository, IndexTime time = IndexTime::Second,
        std::chrono::milliseconds patience = std::chrono::milliseconds::zero());
    IndexLock(const IndexLock &) = delete;
    IndexLock &operator=(const IndexLock &) = delete;
    /// Publishes what libgit2 wrote and releases the lock, so that what was written before a
    /// failure is kept.
    ~IndexLock();

    /// Replaces the index by what libgit2 wrote, in one step. Keeps the lock, so that a reference
    /// can move before another process changes the index.
    /// @throws LibGit2Exception
    void publish();

    /// Calls publish() and releases the lock.
    void release();

    /// Releases the lock, and leaves the index as it was before what libgit2 wrote: for an
    /// operation that refuses before it changes any file.
    void discard() noexcept;

  private:
    class LockFile;
    class Held;

    /// Null after the lock is released.
    std::unique_ptr<Held> held_;
};

} // namespace vclink::git
