// SPDX-License-Identifier: MIT
#include "vclink/git/LibGit2Guard.hpp"

#include <git2/global.h>

#include "error/logging/logger.hpp"
#include "util/GitMergeDriverLookup.hpp"

namespace vclink::git
{

LibGit2Guard::LibGit2Guard() : drivers_(std::make_unique<GitMergeDriverLookup>())
{
    // Creates the logger and Boost.Log's core before a guard with static storage is complete, so
    // that they outlive the guard and the record of its end.
    static_cast<void>(logger().is_logging_enabled());
    git_libgit2_init();
    try
    {
        // The records keep their addresses, because the nodes of the map are moved.
        *drivers_ = registerMergeDrivers();
    }
    catch (...)
    {
        git_libgit2_shutdown();
        throw;
    }
}

LibGit2Guard::~LibGit2Guard()
{
    unregisterMergeDrivers(*drivers_);
    git_libgit2_shutdown();
}

} // namespace vclink::git
