// SPDX-License-Identifier: MIT
#include "util/lock/referenceLocks.hpp"

#include <algorithm>
#include <cstdint>
#include <limits>
#include <memory>
#include <thread>

#include <git2/config.h>
#include <git2/repository.h>
#include <git2/transaction.h>

namespace vclink::git
{
namespace
{

using std::chrono::microseconds;
using std::chrono::milliseconds;

constexpr milliseconds defaultTimeout{100};
/// A call of the host must end.
constexpr milliseconds longestTimeout{60'000};
constexpr microseconds firstStep{1'000};
constexpr microseconds longestStep{32'000};

/// Returns between three quarters and five quarters of the time.
microseconds vary(microseconds step, std::chrono::steady_clock::time_point now)
{
    const auto ticks = now.time_since_epoch().count();
    return step * 3 / 4 + microseconds(ticks % (step.count() / 2));
}

} // namespace

milliseconds readReferenceLockTimeout(git_repository *repository)
{
    const auto config = acquire<git_config>(git_repository_config_snapshot, repository);
    std::int64_t value = 0;
    if (config.has_error() ||
        call(git_config_get_int64, &value, config.value().get(), "core.filesRefLockTimeout")
            .has_error())
    {
        return defaultTimeout;
    }
    // git waits forever for a negative number, and fails for one that is no int.
    const bool isLimited = value >= 0 && value <= std::numeric_limits<int>::max();
    return isLimited ? milliseconds(value) : longestTimeout;
}

ReferenceLockWait::ReferenceLockWait(milliseconds timeout)
    : end_(std::chrono::steady_clock::now() + timeout), step_(firstStep)
{
}

void awaitUnlocked(git_repository *repository, const char *reference)
{
    check(retryWhileLocked(
        repository,
        [=]() -> GitResult<void>
        {
            git_transaction *raw = nullptr;
            const auto made = call(git_transaction_new, &raw, repository);
            // Releases the lock again.
            const std::unique_ptr<git_transaction, void (*)(git_transaction *)> transaction(
                raw, git_transaction_free);
            return made.has_error() ? made : call(git_transaction_lock_ref, raw, reference);
        }));
}

bool ReferenceLockWait::pause()
{
    const auto now = std::chrono::steady_clock::now();
    if (now >= end_)
    {
        return false;
    }
    std::this_thread::sleep_until(std::min(now + vary(step_, now), end_));
    step_ = std::min(step_ * 2, longestStep);
    return true;
}

} // namespace vclink::git
