// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <string>
#include <utility>
#include <vector>

#include "support/Command.hpp"
#include "support/GitFixture.hpp"
#include "support/GitRepository.hpp"
#include "support/strings.hpp"

namespace vclink::test
{

/// A record of the status command: state and name.
using Record = std::pair<std::string, std::string>;
using Records = std::vector<Record>;

/// Reads the output of the status command, whose lines end with `end`. A line that is not a record
/// has an empty state in the result.
Records parseRecords(const std::string &output, char end = '\n');

/// Base of the tests that run the program. Each has a folder of its own, in which it runs unless
/// told otherwise.
class ShellFixture : public GitFixture
{
  protected:
    /// The program with these arguments.
    Command shell(std::vector<std::string> arguments) const;
    /// As shell(), run in a folder.
    CommandResult runIn(const std::filesystem::path &place,
                        std::vector<std::string> arguments) const;
    /// The states of what is named, clean files too, told with -z; an unexpected end fails the
    /// test.
    Records statesIn(const std::filesystem::path &place,
                     const std::vector<std::string> &names = {}) const;

    /// A repository that is served, but whose configuration can't be read, so that its states
    /// can't be asked for.
    GitRepository makeBrokenRepository() const;
};

} // namespace vclink::test
