// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <ctime>

#include <git2/index.h>

namespace vclink::git
{

/// Returns true if the time that an entry of an index has noted is this one. Some programs write an
/// index without fractions of seconds.
inline bool isSameTime(const git_index_time &noted, const timespec &time) noexcept
{
    return noted.seconds == static_cast<std::int32_t>(time.tv_sec) &&
           (noted.nanoseconds == 0 ||
            noted.nanoseconds == static_cast<std::uint32_t>(time.tv_nsec));
}

} // namespace vclink::git
