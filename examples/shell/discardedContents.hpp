// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include "namedPaths.hpp"

namespace vclink::shell
{

class Session;

/// How to restore what a revert discards, in lines for a person; empty for what is not discarded.
struct WayBack
{
    std::string files;
    std::string staged;
};

/// Adds changed files whose states are clean, since Git was told not to look at them: a revert
/// discards their changes too. Without git none is found.
void addOverlooked(CMAdapter &adapter, std::vector<NamedPath> &paths);

/// Puts what a revert discards into the repository's store of objects: the files as they are on the
/// disk, and as they are staged if that is something else. The index stays as it is.
/// @param paths what is reverted
/// @param changed the files of which that is known
/// @throws ShellFailure if something could not be kept, or git or tar is not installed
WayBack keepContents(Session &session, const std::vector<NamedPath> &paths,
                     const FileStateMap &changed);

} // namespace vclink::shell
