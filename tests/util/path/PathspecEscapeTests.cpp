// SPDX-License-Identifier: MIT
#include <cstddef>
#include <set>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "PathspecMatches.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/text.hpp"
#include "util/path/PathspecArray.hpp"
#include "util/path/pathspecEscape.hpp"

namespace
{

using vclink::git::escapeExactPathspec;
using vclink::git::escapePathspec;
using vclink::git::makeFilePathspec;
using vclink::test::asPath;
using Names = std::set<std::string>;

/// Each is the name of one file; every one is a decoy for the others.
const std::vector<std::string> hardNames{
    "a",      "#a",   "!a",   "##a",     "!!a",   "#!a",    "!#a",      "#",         "!",
    "# ",     "! ",   "a ",   "a  ",     "a\t",   "a\r",    "a\n",      "a\v",       "a\f",
    "a \r\n", "a\r ", " ",    "\t",      "\r",    "\n",     "\v",       "\f",        " a",
    "\ta",    "\ra",  "\na",  "a\nb",    "a\vb",  "a\fb",   "a\rb",     "a\tb",      "a b",
    "a\r\nb", "#a ",  "!a\n", "#a\nb\n", "!a\fb", "\n#a",   " !a",      ":a",        ":!a",
    ":^a",    "^a",   "-a",   "~a",      "a#",    "a!",     "a]",       "]a",        "a^",
    "{a,b}",  "a-b",  ".a",   "...",     "..a",   "\xFF",   "\xC2\xA0", "a\xC2\xA0", "\xC3\xBC ",
    "\x01",   "\x7F", "a$",   "\"a\"",   "'a'",   ":(top)a"};

std::string shown(const std::string &name)
{
    return testing::PrintToString(name);
}

class PathspecEscape : public vclink::test::GitFixture
{
  protected:
    vclink::test::GitRepository makeTree(const std::vector<std::string> &names) const
    {
        auto repository = makeRepository();
        for (const auto &name : names)
            repository.write(name, "content of " + name);
        repository.commitAll("all");
        return repository;
    }

    void expectMeansExactly(const vclink::test::GitRepository &repository,
                            const std::vector<std::string> &names) const
    {
        const vclink::test::PathspecMatches matches(repository);
        std::vector<upath> files;
        for (const auto &name : names)
            files.push_back(asPath(repository / name));
        const auto pathspec = makeFilePathspec(files, asPath(repository.path()));
        for (const auto &answer : matches.inEveryCall(pathspec))
        {
            EXPECT_EQ(answer.names, Names(names.begin(), names.end()))
                << answer.call << " for " << testing::PrintToString(names);
        }
    }

    vclink::test::LibGit2Session session_{environment()};
};

TEST_F(PathspecEscape, LeavesPlainNamesWildcardsAndDangerousCharactersWhereTheyAreHarmless)
{
    for (const auto *name : {"a",      "sub/dir/file.txt",
                             "a#b",    "a!b",
                             "a b",    " a",
                             "sub /a", "\r\ta",
                             "",       "gr\xC3\xBC\xC3\x9F",
                             "\xFF",   "a\\b",
                             "*",      "a*b",
                             "a?",     "[a]",
                             "[!a]",   "**/x",
                             "a/#b",   "a/!b",
                             "a /b",   "a\t/b",
                             "x\ry"})
        EXPECT_EQ(escapePathspec(name), name);
}

TEST_F(PathspecEscape, MeansExactlyTheFilesOfAList)
{
    const auto repository = makeTree(hardNames);
    std::vector<std::string> everySecond;
    for (std::size_t i = 0; i < hardNames.size(); ++i)
    {
        expectMeansExactly(repository, {hardNames[i]});
        if (i + 1 < hardNames.size())
            expectMeansExactly(repository, {hardNames[i], hardNames[i + 1]});
        if (i % 2 == 0)
            everySecond.push_back(hardNames[i]);
    }
    expectMeansExactly(repository, hardNames);
    expectMeansExactly(repository, everySecond);
}

TEST_F(PathspecEscape, MeansTheFilesOfAListThatAllBeginDangerouslyOrDifferOnlyAtTheEnd)
{
    const auto repository = makeTree({"#a", "!b", "#ab", "!a", "a", "b", "\\#a", "x", "same",
                                      "same ", "same\n", "same\r", "same\t", "same#"});
    // All patterns of a list begin alike here, and libgit2 looks only below the common beginning.
    const std::vector<std::string> lists[] = {
        {"#a", "!b"},        {"!b", "#a"},         {"#a", "#ab"},    {"!a", "!b"},
        {"same ", "same\n"}, {"same\r", "same\t"}, {"same", "same "}};
    for (const auto &list : lists)
        expectMeansExactly(repository, list);
}

TEST_F(PathspecEscape, MeansADangerousNameInASubfolder)
{
    const auto repository =
        makeTree({"#d/#f", "#d/f", "d/#f", "d/f", "d /f", "d /f ", "!d/f", "d\n/f", "d\n/f\n"});
    for (const auto *name : {"#d/#f", "#d/f", "d/#f", "d/f", "d /f", "d /f ", "!d/f", "d\n/f"})
        expectMeansExactly(repository, {name});
    expectMeansExactly(repository, {"#d/f", "!d/f", "d\n/f\n"});
}

/// A '[' that the name leaves open must not take in what is put for the other characters.
TEST_F(PathspecEscape, MeansADangerousNameWithABracket)
{
    const std::vector<std::string> names{
        "a[ ", "a[", "a ",   "a[\n", "a\n",  "#[", "#",   "#a[1]", "#a1",  "a[1] ", "a1 ",   "[ ",
        "[",   " ",  "![a]", "!a",   "[\n]", "\n", "#[]", "#]",    "[]\t", "[!]\f", "[:a:] "};
    const auto repository = makeTree(names);
    for (const auto *name : {"a[ ", "a[\n", "#[", "#a[1]", "a[1] ", "[ ", "![a]", "[\n]", "#[]",
                             "[]\t", "[!]\f", "[:a:] "})
        expectMeansExactly(repository, {name});
    expectMeansExactly(repository, {"a[ ", "#a[1]", "[ "});
}

/// What can't be told apart from a pattern acts as one.
TEST_F(PathspecEscape, ActsAsAPatternForWildcardCharacters)
{
    const auto repository = makeTree({"a[1].txt", "a1.txt", "b*", "bx", "c?", "cx", "d"});
    const vclink::test::PathspecMatches matches(repository);
    const upath root = asPath(repository.path());
    const std::vector<std::pair<std::string, Names>> cases{
        {"a[1].txt", {"a[1].txt", "a1.txt"}}, {"b*", {"b*", "bx"}}, {"c?", {"c?", "cx"}}};
    for (const auto &[name, meant] : cases)
    {
        const auto pathspec = makeFilePathspec({asPath(repository / name)}, root);
        for (const auto &answer : matches.inEveryCall(pathspec))
            EXPECT_EQ(answer.names, meant) << answer.call << " for " << shown(name);
    }
}

/// The names of files that hold what acts as a pattern elsewhere.
const std::vector<std::string> wildcardNames{
    "*",    "?",    "a*",  "a?",   "[",    "[a]",   "[ab]",  "a[1]",  "[!a]",   "[^a]", "**",
    "\\",   "a\\b", "a\\", "\\*",  "\\[",  "[\\]",  "[a\\]", "\\#a",  "#*",     "!?",   "* ",
    "[ ",   "a*\n", "*\r", "[]",   "[]a]", "f/*",   "f*/x",  "f/[x]", "f[1]/x", "\\!a", "[[]",
    "[\n]", "?\f",  "\\ ", "a\\ ", "\\\\", "[:a:]", "a[",    "#[",    "[*]"};

/// What those names would match as patterns.
const std::vector<std::string> decoys{"x", "ab", "a1", "ac", "f/x", "fx/x", "f1/x", "b", "1"};

class ExactPathspec : public PathspecEscape
{
  protected:
    static std::vector<std::string> allNames()
    {
        auto names = hardNames;
        for (const auto *more : {&wildcardNames, &decoys})
            names.insert(names.end(), more->begin(), more->end());
        return names;
    }
    void expectMeansExactly(const vclink::test::PathspecMatches &matches,
                            const std::vector<std::string> &names) const
    {
        std::vector<std::string> patterns;
        for (const auto &name : names)
            patterns.push_back(escapeExactPathspec(name));
        const vclink::git::PathspecArray pathspec(patterns);
        for (const auto &answer : matches.inEveryCall(pathspec))
        {
            EXPECT_EQ(answer.names, Names(names.begin(), names.end()))
                << answer.call << " for " << testing::PrintToString(names);
        }
    }
};

TEST_F(ExactPathspec, ReplacesOnlyWhatMeansSomethingElse)
{
    for (const auto *name : {"a", "sub/dir/file.txt", "a#b", "a!b", "a b", " a", "sub /a", "a]",
                             "gr\xC3\xBC\xC3\x9F", "\xFF", ""})
        EXPECT_EQ(escapeExactPathspec(name), name);
    EXPECT_EQ(escapeExactPathspec("a*b"), "a[^//\x01-)+-\xFF]b");
    EXPECT_EQ(escapeExactPathspec("[x]"), "[^//\x01-Z\\\\-\xFF]x]");
    EXPECT_EQ(escapeExactPathspec("#a#"), "[^//\x01-\"$-\xFF]"
                                          "a#");
    EXPECT_EQ(escapeExactPathspec("a\nb"), "a[^//\x01-\\\t\\\v-\xFF]"
                                           "b");
    EXPECT_EQ(escapeExactPathspec(" a "), " a[^//\x01-\x1F\\!-\xFF]");
}

/// libgit2 also compares a pattern literally.
TEST_F(ExactPathspec, IsNoNameOfAnotherFile)
{
    for (const auto &name : wildcardNames)
        EXPECT_NE(escapeExactPathspec(name).find("//"), std::string::npos) << shown(name);
}

TEST_F(ExactPathspec, MeansExactlyTheOneFile)
{
    const auto repository = makeTree(allNames());
    const vclink::test::PathspecMatches matches(repository);
    for (const auto &name : wildcardNames)
        expectMeansExactly(matches, {name});
    for (const auto &name : hardNames)
        expectMeansExactly(matches, {name});
}

TEST_F(ExactPathspec, MeansExactlyTheFilesOfAList)
{
    const auto repository = makeTree(allNames());
    const vclink::test::PathspecMatches matches(repository);
    expectMeansExactly(matches, wildcardNames);
    for (std::size_t i = 0; i + 1 < wildcardNames.size(); ++i)
        expectMeansExactly(matches, {wildcardNames[i], wildcardNames[i + 1]});
    expectMeansExactly(matches, {"#a", "!a"});
    expectMeansExactly(matches, {"*", "*", "*"});
}

} // namespace
