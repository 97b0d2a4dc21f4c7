// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <map>
#include <string>

#include "GitReport.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/FileState.hpp"
#include "vclink/FileStateMap.hpp"

namespace vclink::test
{

/// States by path, relative to the root.
using States = std::map<std::string, FileState::State>;

/// What the library reports; the running test fails over a path that is not below the root.
States statesByPath(const std::string &root, const FileStateMap &states);
/// The same, of everything in the working copy.
States statesOfAll(CMAdapter &adapter);

/// The states that the library owes for what git reports, of the paths that `isAsked` takes. What
/// is not asked for is not looked at either: a file moved in from elsewhere is new.
/// @param blobs the contents of the blobs of moveCandidates()
States expectedStates(const GitReport &report, const Blobs &blobs,
                      const std::function<bool(const std::string &path)> &isAsked);

} // namespace vclink::test
