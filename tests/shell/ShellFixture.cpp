// SPDX-License-Identifier: MIT
#include "ShellFixture.hpp"

namespace vclink::test
{

Records parseRecords(const std::string &output, char end)
{
    Records records;
    for (const std::string &line : split(output, end))
    {
        const std::size_t tab = line.find('\t');
        if (tab == std::string::npos)
            records.emplace_back("", line);
        else
            records.emplace_back(line.substr(0, tab), line.substr(tab + 1));
    }
    return records;
}

Command ShellFixture::shell(std::vector<std::string> arguments) const
{
    arguments.insert(arguments.begin(), VCLINK_SHELL);
    return Command(std::move(arguments))
        .in(folder().path())
        .environment("LSAN_OPTIONS", "print_suppressions=0:suppressions=" VCLINK_LEAK_SUPPRESSIONS);
}

CommandResult ShellFixture::runIn(const std::filesystem::path &place,
                                  std::vector<std::string> arguments) const
{
    return shell(std::move(arguments)).in(place).run();
}

Records ShellFixture::statesIn(const std::filesystem::path &place,
                               const std::vector<std::string> &names) const
{
    std::vector<std::string> arguments{"status", "--all", "-z", "--"};
    arguments.insert(arguments.end(), names.begin(), names.end());
    const CommandResult result = runIn(place, arguments);
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    EXPECT_EQ(result.errors, "");
    return parseRecords(result.output, '\0');
}

GitRepository ShellFixture::makeBrokenRepository() const
{
    GitRepository repository = makeRepository("broken");
    repository.write(".git/config", "[core\n");
    return repository;
}

} // namespace vclink::test
