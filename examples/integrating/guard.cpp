// SPDX-License-Identifier: MIT
#include <mutex>
#include <shared_mutex>
#include <string>

#include "fl/filesystem/path.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/LibGit2Guard.hpp"

/// @param guards one for the process
bool probe(std::shared_mutex &guards, const upath &folder)
{
    const std::shared_lock lock(guards);
    return vclink::git::GitAdapterFactory().isAdapterFor(folder);
}

void mergeAlone(std::shared_mutex &guards, vclink::CMAdapter &adapter, const std::string &name)
{
    const std::unique_lock lock(guards);
    const vclink::git::LibGit2Guard guard;
    vclink::git::BranchManager::create(adapter)->merge(name);
}
