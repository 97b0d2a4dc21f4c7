// SPDX-License-Identifier: MIT
#include "vclink/git/LibGit2Guard.hpp"

#include <git2/global.h>

#include "util/GitMergeDriverLookup.hpp"

namespace vclink::git
{

LibGit2Guard::LibGit2Guard() : drivers_(std::make_unique<GitMergeDriverLookup>())
{
    git_libgit2_init();
    try
    {
        // The records keep their addresses: the nodes of the map are moved.
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
