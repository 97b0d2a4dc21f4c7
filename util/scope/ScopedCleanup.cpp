// SPDX-License-Identifier: MIT
#include "util/scope/ScopedCleanup.hpp"

namespace vclink::git
{

ScopedCleanup::~ScopedCleanup()
{
    try
    {
        const std::function<void()> cleanup = std::exchange(cleanup_, nullptr);
        if (cleanup)
        {
            cleanup();
        }
    }
    catch (...) // The result of the scope counts.
    {
    }
}

} // namespace vclink::git
