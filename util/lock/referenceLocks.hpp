// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>

#include <git2/errors.h>
#include <git2/types.h>

#include "error/errorUtil/GitResult.hpp"

namespace vclink::git
{

/// How long git would try to lock a reference that is locked already: `core.filesRefLockTimeout` in
/// milliseconds, 0 for a single try, 100 by default and when the number can't be read. A negative
/// number, which lets git try without end, gives one minute.
/// git_repository_config_snapshot, git_config_get_int64.
std::chrono::milliseconds readReferenceLockTimeout(git_repository *repository);

/// The pauses between tries, which grow and are never quite the same, so that two processes don't
/// keep meeting.
class ReferenceLockWait
{
  public:
    explicit ReferenceLockWait(std::chrono::milliseconds timeout);

    /// Pauses before the next try. The last one comes when the time is over.
    /// @return false, at once, when there is none
    [[nodiscard]] bool pause();

  private:
    std::chrono::steady_clock::time_point end_;
    std::chrono::microseconds step_;
};

/// Makes a change of references, and makes it again for a while if a reference is locked: git packs
/// and collects references in the background, and holds such locks for milliseconds. libgit2 itself
/// does not wait.
/// @param change gives a GitResult; nothing of a try that finds the lock may remain
/// @return the result of the last try
template <class Change> auto retryWhileLocked(git_repository *repository, const Change &change)
{
    auto result = change();
    const auto isLocked = [&result]
    { return result.has_error() && result.error().getCode() == GIT_ELOCKED; };
    if (isLocked())
    {
        ReferenceLockWait wait(readReferenceLockTimeout(repository));
        while (isLocked() && wait.pause())
        {
            result = change();
        }
    }
    return result;
}

/// For what must be written before a reference moves: waits as retryWhileLocked() until nobody
/// holds the reference's lock, so that one that stays fails the operation first.
/// git_transaction_lock_ref.
/// @param reference full name
/// @throws LibGit2Exception with the code GIT_ELOCKED
void awaitUnlocked(git_repository *repository, const char *reference);

} // namespace vclink::git
