// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <vector>

#include "namedPaths.hpp"

namespace vclink::shell
{

/// What a list contains for a file whose path the back end would follow to another one.
enum class LinkNames
{
    /// nothing: the operation looks files up by their states, and uses the paths that it finds
    None,
    /// a pattern if there is one, see patternForEntry()
    Patterns
};

struct Cover
{
    /// the files to act on
    FileStateMap files;
    /// the list for the back end
    std::vector<upath> list;
};

/// Makes a list for the back end that means all files to act on, among the named files and those
/// below the named folders, and no other file that matters. The list is short, because the back end
/// compares each file of the working copy with the whole list. A folder stays in the list if the
/// back end treats it as everything below it.
/// @param isMeant whether a file of this state is to be acted on
/// @throws what the system throws if the folder cannot be read
Cover cover(const upath &root, const std::vector<NamedPath> &paths,
            const std::function<bool(FileState::State)> &isMeant, LinkNames links);

} // namespace vclink::shell
