// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ChangeFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::AllOf;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;
using testing::Pair;

/// Names that a pattern, a command line or a terminal could misread.
const std::vector<std::string> oddFileNames{"#notes#",
                                            "!a",
                                            "trailing blank ",
                                            " leading blank",
                                            "a[1].txt",
                                            "[q]",
                                            "s*r",
                                            "?x",
                                            "-n",
                                            "--",
                                            "--as-is",
                                            "{}",
                                            "++",
                                            "a,b",
                                            "new\nline",
                                            "tab\t",
                                            "return\r",
                                            "escape\33[31m",
                                            "quo\"te",
                                            "\xC3\xBC\xC3\xB1\xC3\xAF",
                                            "\xFF\xFE",
                                            "cut \xE2\x82",
                                            "folder#/!file"};

class ShellChangeOfOddNames : public ChangeFixture
{
  protected:
    ShellChangeOfOddNames()
    {
        for (const auto &name : oddFileNames)
            repository_.write(name, name);
    }
    std::vector<std::string> named(const std::string &command) const
    {
        std::vector<std::string> arguments{command, "--"};
        arguments.insert(arguments.end(), oddFileNames.begin(), oddFileNames.end());
        return arguments;
    }
    std::map<std::string, std::string> all(const std::string &letters) const
    {
        std::map<std::string, std::string> expected;
        for (const auto &name : oddFileNames)
            expected[name] = letters;
        return expected;
    }
};

TEST_F(ShellChangeOfOddNames, AddsThemAll)
{
    succeed(named("add"));
    EXPECT_EQ(letters(), all("A "));
}

TEST_F(ShellChangeOfOddNames, AddsThemOneByOneAndNoOther)
{
    const std::vector<std::string> names{"#notes#", "!a", "trailing blank ", "-n", "\xFF\xFE"};
    for (const auto &name : names)
    {
        succeed({"add", "--", name});
        EXPECT_EQ(repository_.git({"diff", "--cached", "--name-only", "-z"}), name + '\0');
        repository_.git({"reset", "--quiet"});
    }
}

TEST_F(ShellChangeOfOddNames, RemovesThemAll)
{
    repository_.commitAll("odd");
    succeed(named("rm"));
    const auto tracked = split(repository_.git({"ls-files", "-z"}), '\0');
    EXPECT_EQ(tracked.size(), 5U);
    for (const auto &name : oddFileNames)
        EXPECT_EQ(repository_.read(name), name);
}

TEST_F(ShellChangeOfOddNames, RemovesOneAndNoOther)
{
    repository_.commitAll("odd");
    for (const std::string name :
         {"#notes#", "!a", "trailing blank ", "-n", "\xFF\xFE", "return\r"})
    {
        succeed({"rm", "--", name});
        EXPECT_EQ(repository_.git({"diff", "--cached", "--name-only", "-z"}), name + '\0');
        repository_.git({"reset", "--quiet"});
    }
}

TEST_F(ShellChangeOfOddNames, RevertsThemAll)
{
    repository_.commitAll("odd");
    for (const auto &name : oddFileNames)
        repository_.write(name, name + " edited");
    EXPECT_EQ(letters(), all(" M"));
    succeed(named("revert"));
    EXPECT_THAT(letters(), IsEmpty());
    for (const auto &name : oddFileNames)
        EXPECT_EQ(repository_.read(name), name);
}

TEST_F(ShellChangeOfOddNames, RevertsOneAndNoOther)
{
    repository_.commitAll("odd");
    for (const std::string name :
         {"#notes#", "!a", "trailing blank ", "-n", "\xFF\xFE", "return\r"})
    {
        for (const auto &odd : oddFileNames)
            // Of another size than before: git looks at whole seconds.
            repository_.write(odd, odd + " edited");
        succeed({"revert", "--", name});
        std::map<std::string, std::string> expected = all(" M");
        expected.erase(name);
        EXPECT_EQ(letters(), expected);
    }
}

TEST_F(ShellChangeOfOddNames, MarksThemAsResolved)
{
    for (const auto &name : oddFileNames)
        succeed({"resolved", "--", name});
    EXPECT_EQ(letters(), all("A "));
}

/// Files that the library can't be told of, beside ones that their names could be mistaken for.
class ShellChangeOfNamesWithBackslash : public ChangeFixture
{
  protected:
    ShellChangeOfNamesWithBackslash()
    {
        repository_.write("folder\\c", "");
        repository_.write("other\\file", "");
        repository_.write("plain", "");
    }
    const std::string leftOut_ = ", because a backslash in a name is read as a slash:\n  "
                                 "\"folder\\\\c\"\n  \"other\\\\file\"\n";
};

TEST_F(ShellChangeOfNamesWithBackslash, TellsThatTheyWereNotAdded)
{
    EXPECT_EQ(fail({"add", "."}), "vclink-shell: Others were not added" + leftOut_);
    EXPECT_THAT(letters(), ElementsAre(Pair("folder\\c", "??"), Pair("other\\file", "??"),
                                       Pair("plain", "A ")));
}

TEST_F(ShellChangeOfNamesWithBackslash, TellsThatTheyWereNotRemoved)
{
    repository_.commitAll("odd");
    EXPECT_EQ(fail({"rm", "."}), "vclink-shell: Not all were removed" + leftOut_);
    EXPECT_THAT(split(repository_.git({"ls-files", "-z"}), '\0'),
                ElementsAre("folder\\c", "other\\file"));
}

TEST_F(ShellChangeOfNamesWithBackslash, TellsThatTheyWereNotReverted)
{
    repository_.commitAll("odd");
    for (const std::string name : {"folder\\c", "other\\file", "plain"})
        repository_.write(name, "edited\n");
    EXPECT_EQ(fail({"revert", "--forget", "."}), "vclink-shell: Not all were reverted" + leftOut_);
    EXPECT_THAT(letters(), ElementsAre(Pair("folder\\c", " M"), Pair("other\\file", " M")));
}

TEST_F(ShellChangeOfNamesWithBackslash, ActsOnThemBelowAFolderWhereItCan)
{
    repository_.write("folder/odd\\name", "");
    repository_.commitAll("odd");
    repository_.write("folder/odd\\name", "edited\n");
    succeed({"revert", "folder"});
    EXPECT_THAT(letters(), IsEmpty());
}

TEST_F(ShellChangeOfOddNames, ShowsThemEscapedWhereTheyAreRefused)
{
    const std::string reason = refuse({"add", "no\33[31m", "none\xFF", "--", "-x"});
    EXPECT_THAT(reason, AllOf(HasSubstr("  \"no\\033[31m\": "), HasSubstr("  \"none\\377\": "),
                              HasSubstr("  -x: "), Not(HasSubstr("\33"))));
}

} // namespace
} // namespace vclink::test
