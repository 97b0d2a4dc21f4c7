// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>

#include <git2/errors.h>
#include <git2/types.h>

#include "error/errorUtil/GitResult.hpp"

namespace vclink::git
{

/// Returns how long git would try to lock a locked reference: `core.filesRefLockTimeout` in
/// milliseconds, 0 for a single try, 100 by default and if the number cannot be read. A negative
/// number, with which git tries forever, means one minute. git_repository_config_snapshot,
/// git_config_get_int64.
std::chrono::milliseconds readReferenceLockTimeout(git_repository *repository);

/// The pauses between tries. They grow and vary, so that two processes do not collide again and
/// again.
class ReferenceLockWait
{
  public:
    explicit ReferenceLockWait(std::chrono::milliseconds timeout);

    /// Pauses before the next try. The last try is at the end of the time.
    /// @return false immediately if there is no further try
    [[nodiscard]] bool pause();

  private:
    std::chrono::steady_clock::time_point end_;
    std::chrono::microseconds step_;
};

/// Changes references, and tries again for some time if a reference is locked: git packs references
/// in the background, and holds such locks for milliseconds. libgit2 itself does not wait.
/// @param change returns a GitResult; a try that finds the lock must leave no effect
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

/// Waits until nobody holds the reference's lock, as long as retryWhileLocked() does. Call it
/// before writing what must be written before a reference moves, so that a permanent lock fails the
/// operation first. git_transaction_lock_ref.
/// @param reference the full name
/// @throws LibGit2Exception with the code GIT_ELOCKED
void awaitUnlocked(git_repository *repository, const char *reference);

} // namespace vclink::git
