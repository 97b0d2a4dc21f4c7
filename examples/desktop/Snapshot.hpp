// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include "fl/filesystem/path.hpp"
#include "vclink/FileStateMap.hpp"

namespace vclink::desktop
{

class Work;

/// What the window shows of a working copy, as it was at one moment.
struct Snapshot
{
    upath root;
    FileStateMap states;
    /// The short name; empty before the first commit and with a detached HEAD.
    std::string branch;
    /// Short names, the remote ones with their remote in front.
    std::vector<std::string> localBranches;
    std::vector<std::string> remoteBranches;
    /// The library's word, e.g. "Normal" or "Conflicts".
    std::string repositoryState;

    std::vector<upath> filesWith(FileState::State state) const;
    /// Tracked files that are not as in the last commit.
    std::vector<upath> changedFiles() const;
    std::vector<std::string> remotes() const;
};

/// @throws what the library throws
Snapshot readSnapshot(Work &work);

} // namespace vclink::desktop
