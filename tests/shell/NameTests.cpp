// SPDX-License-Identifier: MIT
#include <algorithm>

#include <gmock/gmock.h>

#include "ShellFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::ElementsAre;

/// How names of every kind get in and out.
class ShellNames : public ShellFixture
{
};

/// Names that a line, a terminal, a command line or a pattern could misread.
const std::vector<std::string> oddPaths{" leading blank",
                                        "trailing blank ",
                                        "two  blanks",
                                        "-z",
                                        "--",
                                        "--help",
                                        "status",
                                        "probe",
                                        "[a]",
                                        "[a,b]",
                                        "{}",
                                        "++",
                                        "a,b",
                                        "%%",
                                        "#note#",
                                        "!bang",
                                        "~",
                                        "quo\"te",
                                        "apos'trophe",
                                        "new\nline",
                                        "tab\tstop",
                                        "return\rhere",
                                        "bell\a",
                                        "escape\33[31m",
                                        "delete\177",
                                        "one\1",
                                        "\xC3\xBC\xC3\xB1\xC3\xAF",
                                        "\xE6\x97\xA5\xE6\x9C\xAC.txt",
                                        "\xF0\x9F\x8C\x8D"};

TEST_F(ShellNames, GoOutByteForByteBetweenNulsAsGitWritesThem)
{
    const GitRepository repository = makeRepository();
    std::vector<std::string> names = oddPaths;
    names.insert(names.end(),
                 {"\xFF\xFE", "cut \xE2\x82", "\xED\xA0\x80", "mixed \xC3\xBC\xFC", "back\\slash"});
    for (const auto &name : names)
        repository.write(name, "");
    std::vector<std::string> shown;
    for (const auto &[state, name] : statesIn(repository.path()))
    {
        EXPECT_EQ(state, "unversioned");
        shown.push_back(name);
    }
    EXPECT_THAT(shown, testing::UnorderedElementsAreArray(names));
    EXPECT_THAT(shown, testing::UnorderedElementsAreArray(
                           split(repository.git({"ls-files", "-z", "--others"}), '\0')));
}

TEST_F(ShellNames, ComeInAsTheyAre)
{
    const GitRepository repository = makeRepository();
    std::vector<std::string> names = oddPaths;
    names.insert(names.end(), {"\xFF\xFE", "cut \xE2\x82", "\xED\xA0\x80", "mixed \xC3\xBC\xFC"});
    for (const auto &name : names)
        repository.write(name, "");
    for (const auto &name : names)
        EXPECT_THAT(statesIn(repository.path(), {name}), ElementsAre(Record("unversioned", name)));
    Records all;
    for (const auto &name : names)
        all.emplace_back("unversioned", name);
    EXPECT_THAT(statesIn(repository.path(), names), testing::UnorderedElementsAreArray(all));
}

TEST_F(ShellNames, NeedNoDoubleDashUnlessTheyBeginWithADash)
{
    const GitRepository repository = makeRepository();
    const std::vector<std::string> names{"status", "version", "[a]", "{}", "++"};
    std::vector<std::string> arguments{"status", "--all"};
    for (const auto &name : names)
    {
        repository.write(name, "");
        arguments.push_back(name);
    }
    repository.write("-n", "");
    arguments.insert(arguments.end(), {"--", "-n"});
    const CommandResult result = runIn(repository.path(), arguments);
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    EXPECT_EQ(parseRecords(result.output).size(), names.size() + 1);
}

TEST_F(ShellNames, AreShownOnOneLineInTheWayOfGit)
{
    const GitRepository repository = makeRepository();
    std::vector<std::string> names = oddPaths;
    names.emplace_back("back\\slash");
    for (const auto &name : names)
        repository.write(name, "");
    std::vector<std::string> shown;
    for (const auto &[state, name] :
         parseRecords(runIn(repository.path(), {"status", "--all"}).output))
    {
        EXPECT_EQ(state, "unversioned") << name;
        shown.push_back(name);
    }
    const auto expected =
        split(repository.git({"-c", "core.quotePath=false", "ls-files", "--others"}), '\n');
    EXPECT_THAT(shown, testing::UnorderedElementsAreArray(expected));
    EXPECT_EQ(shown.size(), names.size());
}

TEST_F(ShellNames, AreShownQuotedWhereATerminalOrALineCouldMisreadThem)
{
    const struct
    {
        std::string name;
        std::string shown;
    } cases[] = {
        {"plain name.txt", "plain name.txt"},
        {"'[a]*?$&;", "'[a]*?$&;"},
        {"\xC3\xBC \xF0\x9F\x8C\x8D", "\xC3\xBC \xF0\x9F\x8C\x8D"},
        {"a\nb", R"("a\nb")"},
        {"a\a\b\t\v\f\rb", R"("a\a\b\t\v\f\rb")"},
        {"a\33[2Jb", R"("a\033[2Jb")"},
        {"a\177", R"("a\177")"},
        {"a\"b", R"("a\"b")"},
        {"a\\b", R"("a\\b")"},
        {"a\xC2\x9B"
         "31m",
         R"("a\302\23331m")"},
        {"a\xFF", R"("a\377")"},
        {"\xC3\xBC\xFC", "\"\xC3\xBC\\374\""},
        {"\xED\xA0\x80", R"("\355\240\200")"},
    };
    const GitRepository repository = makeRepository();
    std::vector<std::string> expected;
    for (const auto &[name, shown] : cases)
    {
        repository.write(name, "");
        expected.push_back(shown);
    }
    std::vector<std::string> shown;
    for (const auto &[state, name] :
         parseRecords(runIn(repository.path(), {"status", "--all"}).output))
        shown.push_back(name);
    EXPECT_THAT(shown, testing::UnorderedElementsAreArray(expected));
}

TEST_F(ShellNames, OfTheWorkingCopyItselfMayBeOdd)
{
    const std::string odd = "\xFF[copy]\n";
    const GitRepository repository = makeRepository(odd);
    repository.write("folder/file", "");
    EXPECT_THAT(statesIn(repository / "folder"), ElementsAre(Record("unversioned", "file")));
    EXPECT_EQ(shell({"-C", odd, "status", "folder"}).run().output, "unversioned\tfolder/file\n");
}

} // namespace
} // namespace vclink::test
