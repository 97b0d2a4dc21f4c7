// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <vector>

#include "namedPaths.hpp"

namespace vclink::shell
{

/// What a list holds for files whose paths the back end would follow to others.
enum class LinkNames
{
    /// nothing: the call looks files up by their states, and takes the paths that it finds
    None,
    /// patterns, where there are any, see patternForEntry()
    Patterns
};

struct Cover
{
    /// what is to be acted on
    FileStateMap files;
    /// what the back end is told
    std::vector<upath> list;
};

/// A short list that means, to the back end, all files that are to be acted on, of those named and
/// below the folders named, and no others that matter: it looks each of the working copy's files up
/// in the whole list, which takes long where thousands of files are named. A folder stays in the
/// list if the back end treats it as everything below it.
/// @param isMeant whether a file of this state is to be acted on
/// @throws what the system throws if the folder cannot be read
Cover cover(const upath &root, const std::vector<NamedPath> &paths,
            const std::function<bool(FileState::State)> &isMeant, LinkNames links);

} // namespace vclink::shell
