// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <cstddef>
#include <string>

#include "vclink/FileState.hpp"
#include "vclink/FileStateMap.hpp"

namespace vclink::shell
{

/// How a state is told to people and programs.
struct StateWords
{
    FileState::State state;
    const char *name;
    /// ends in the letter 'm'; empty for the terminal's own colour
    const char *colour;
    const char *meaning;
};

/// All states, in the order in which the help and the counts tell them.
extern const std::array<StateWords, 8> stateWords;

const StateWords &wordsFor(FileState state);

/// Whether Git knows the file.
bool isTracked(FileState::State state);
/// Whether it does, and the file is not as in the last commit.
bool isChanged(FileState::State state);
bool isInConflict(FileState::State state);

/// "1 file" or "2 files".
std::string countFiles(std::size_t count);

/// How many files there are of each state, in one line without its end.
std::string countStates(const FileStateMap &states);

} // namespace vclink::shell
