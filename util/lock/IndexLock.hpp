// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include <git2/types.h>

namespace vclink::git
{

/// Holds the index of a repository under git's own lock, `index.lock`, from before it is read until
/// the new one is in place, so that no other process changes it in between. libgit2 itself locks
/// the index only while it writes the file. Until the end the repository works on a private copy:
/// everything that libgit2 writes to the repository's index, also within a checkout or a merge,
/// goes there.
///
/// For one operation on one thread. Does not wait for the lock, as git does not.
class IndexLock
{
  public:
    /// Takes the lock, and gives the repository its copy of the index. git_index_open,
    /// git_repository_set_index, git_index_set_caps.
    /// @param repository outlives the object; must not use its index after publish()
    /// @throws LibGit2Exception with the code GIT_ELOCKED and the name of the lock file if
    /// something else holds the lock; nothing has changed then
    [[nodiscard]] explicit IndexLock(git_repository *repository);
    IndexLock(const IndexLock &) = delete;
    IndexLock &operator=(const IndexLock &) = delete;
    /// Puts what libgit2 wrote in place and gives the lock up, so that what was written before a
    /// failure stays.
    ~IndexLock();

    /// Puts what libgit2 wrote to the index in place, in one step. The lock stays: a reference can
    /// move before another process changes the index.
    /// @throws LibGit2Exception
    void publish();

    /// publish(), and gives the lock up.
    void release();

  private:
    class LockFile;
    class Held;

    /// Null once the lock is given up.
    std::unique_ptr<Held> held_;
};

} // namespace vclink::git
