// SPDX-License-Identifier: MIT
#include "RunCommandFixture.hpp"

#include <gtest/gtest.h>

#include "processError.hpp"
#include "support/LogCapture.hpp"
#include "support/readFile.hpp"
#include "util/command/runCommand.hpp"

namespace vclink::test
{

RunOutcome RunCommandFixture::run(const std::string &command,
                                  const std::map<std::string, std::string> &placeholders) const
{
    const NothingLeft check(environment().temporary());
    RunOutcome outcome;
    try
    {
        outcome.result = git::runCommand(command, placeholders);
    }
    catch (const boost::process::process_error &error)
    {
        outcome.error = error.code();
        EXPECT_TRUE(outcome.error) << error.what();
    }
    return outcome;
}

int RunCommandFixture::resultOf(const std::string &command,
                                const std::map<std::string, std::string> &placeholders) const
{
    const RunOutcome outcome = run(command, placeholders);
    EXPECT_FALSE(outcome.error) << command << ": " << outcome.error.message();
    return outcome.result;
}

std::vector<std::string> RunCommandFixture::recordsOf(const std::string &command) const
{
    constexpr unsigned diagnostic = 0x08;
    const LogCapture log(diagnostic);
    run(command);
    return log.messages();
}

std::string RunCommandFixture::waitUntilRead()
{
    return "until grep -q '^State:.S' /proc/$PPID/status; do :; done";
}

std::string RunCommandFixture::outputOf(const std::string &script)
{
    const std::string command = scripts_.shell(script + '\n' + waitUntilRead());
    const std::string beginning = "Output:\n";
    for (const std::string &record : recordsOf(command))
    {
        if (record.compare(0, beginning.size(), beginning) == 0)
            return record.substr(beginning.size());
    }
    ADD_FAILURE() << "no record of the output of " << command;
    return {};
}

std::vector<std::string> RunCommandFixture::wordsOf(const std::string &commandTemplate)
{
    const std::string out = scripts_.folder() / "words";
    const std::string program =
        scripts_.shell("for word; do printf '%s\\0' \"$word\"; done >" + out);
    EXPECT_EQ(resultOf(commandTemplate, {{"%T", program}}), 0);
    std::vector<std::string> words;
    const std::string bytes = readFile(out);
    for (std::size_t begin = 0; begin < bytes.size();)
    {
        words.emplace_back(bytes.c_str() + begin);
        begin += words.back().size() + 1;
    }
    return words;
}

} // namespace vclink::test
