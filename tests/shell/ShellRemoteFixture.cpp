// SPDX-License-Identifier: MIT
#include "ShellRemoteFixture.hpp"

#include <algorithm>

#include "runOnTerminal.hpp"

namespace vclink::test
{

ShellRemoteFixture::ShellRemoteFixture()
{
    repository_.write("a", "a\n");
    repository_.write("folder/b", "b\n");
    repository_.commitAll("begin");
    repository_.git({"remote", "add", "origin", url_});
    repository_.git({"push", "--quiet", "origin", "main"});
}

CommandResult ShellRemoteFixture::run(const std::vector<std::string> &arguments) const
{
    return runIn(repository_.path(), arguments);
}

void ShellRemoteFixture::succeed(const std::vector<std::string> &arguments) const
{
    const CommandResult result = run(arguments);
    const std::string text = testing::PrintToString(arguments);
    EXPECT_EQ(result.exitStatus, 0) << text;
    EXPECT_EQ(result.output, "") << text;
    EXPECT_EQ(result.errors, "") << text;
}

std::string ShellRemoteFixture::refuse(const std::vector<std::string> &arguments) const
{
    const References here = references(repository_);
    const References there = references(served_);
    const CommandResult result = run(arguments);
    const std::string text = testing::PrintToString(arguments);
    EXPECT_EQ(result.exitStatus, 1) << text;
    EXPECT_EQ(result.output, "") << text;
    EXPECT_EQ(references(repository_), here) << text;
    EXPECT_EQ(references(served_), there) << text;
    const std::string program = "vclink-shell: ";
    EXPECT_EQ(result.errors.substr(0, program.size()), program) << text;
    return result.errors.substr(std::min(program.size(), result.errors.size()));
}

std::string ShellRemoteFixture::show(const std::vector<std::string> &arguments) const
{
    std::vector<std::string> words{"-C", repository_.path().string()};
    words.insert(words.end(), arguments.begin(), arguments.end());
    const TerminalResult result = runOnTerminal(onTerminal("dumb", words));
    EXPECT_EQ(result.exitStatus, 0) << result.text;
    return result.text;
}

std::vector<std::string> ShellRemoteFixture::onTerminal(const std::string &terminal,
                                                        const std::vector<std::string> &arguments)
{
    std::vector<std::string> words{
        "env", "TERM=" + terminal,
        "LSAN_OPTIONS=print_suppressions=0:suppressions=" VCLINK_LEAK_SUPPRESSIONS, VCLINK_SHELL};
    words.insert(words.end(), arguments.begin(), arguments.end());
    return words;
}

ShellRemoteFixture::References ShellRemoteFixture::references(const GitRepository &repository)
{
    References references;
    for (const std::string &line :
         split(repository.git({"for-each-ref", "--format=%(objectname) %(refname)"}), '\n'))
        references[line.substr(line.find(' ') + 1)] = line.substr(0, line.find(' '));
    return references;
}

} // namespace vclink::test
