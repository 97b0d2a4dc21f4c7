// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <string>
#include <system_error>
#include <vector>

#include "support/GitFixture.hpp"
#include "support/NothingLeft.hpp"
#include "support/Scripts.hpp"

namespace vclink::test
{

/// What a run gave: its result or its error.
struct RunOutcome
{
    int result = -1;
    /// without value unless the run threw boost::process::process_error
    std::error_code error;
};

/// Base of the fixtures whose tests run commands.
class RunCommandFixture : public GitFixture
{
  protected:
    /// Runs a command, and checks that nothing stays behind.
    RunOutcome run(const std::string &command,
                   const std::map<std::string, std::string> &placeholders = {}) const;
    /// Runs a command that must not throw.
    int resultOf(const std::string &command,
                 const std::map<std::string, std::string> &placeholders = {}) const;
    /// The records that a run of the command leaves in the log.
    std::vector<std::string> recordsOf(const std::string &command) const;
    /// The text of the record of the output, for a script that goes on until its output is read.
    std::string outputOf(const std::string &script);
    /// A line of a script that waits until the test's process sleeps: it has read what there is.
    static std::string waitUntilRead();
    /// The words that the program of a command is given: the command's first word is replaced by
    /// one that writes them down.
    std::vector<std::string> wordsOf(const std::string &commandTemplate);

    Scripts scripts_{folder() / "scripts"};
};

} // namespace vclink::test
