// SPDX-License-Identifier: MIT
#include "states.hpp"

#include <algorithm>

#include "texts.hpp"

namespace vclink::shell
{

const std::array<StateWords, 8> stateWords{{
    {FileState::Clean, "clean", "", "tracked and unchanged"},
    {FileState::Modified, "modified", "\33[33m", "changed, staged or not"},
    {FileState::Added, "added", "\33[32m", "new, and in the next commit"},
    {FileState::Deleted, "deleted", "\33[31m", "deleted by the next commit"},
    {FileState::Missing, "missing", "\33[1;31m", "tracked, but gone from the disk"},
    {FileState::InConflict, "conflict", "\33[1;35m", "in a conflict that is not resolved yet"},
    {FileState::Unversioned, "unversioned", "\33[36m", "not tracked"},
    {FileState::Unknown, "unknown", "\33[34m", "anything else, e.g. replaced by a symbolic link"},
}};

const StateWords &wordsFor(FileState state)
{
    const auto *const found =
        std::find_if(stateWords.begin(), stateWords.end(),
                     [state](const StateWords &words) { return words.state == state.getState(); });
    return found == stateWords.end() ? stateWords.back() : *found;
}

bool isTracked(FileState::State state)
{
    return state != FileState::Unversioned;
}

bool isChanged(FileState::State state)
{
    return isTracked(state) && state != FileState::Clean;
}

bool isInConflict(FileState::State state)
{
    return state == FileState::InConflict;
}

std::string countFiles(std::size_t count)
{
    return sayCount(count, "%1% file", "%1% files");
}

std::string countStates(const FileStateMap &states)
{
    std::string line = countFiles(states.size());
    const char *separator = ": ";
    for (const StateWords &words : stateWords)
    {
        const auto count = std::count_if(states.begin(), states.end(),
                                         [&words](const FileStateMap::value_type &entry)
                                         { return entry.second.getState() == words.state; });
        if (count != 0)
        {
            line += separator + std::to_string(count) + ' ' + words.name;
            separator = ", ";
        }
    }
    return line;
}

} // namespace vclink::shell
