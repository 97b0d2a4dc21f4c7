// SPDX-License-Identifier: MIT
#include <cstddef>
#include <functional>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "StagingFixture.hpp"

namespace
{

using shared_vclink::git::AlreadyAdded;
using shared_vclink::git::Conflicted;
using shared_vclink::git::NoFilesToRemove;
using testing::ElementsAre;
using testing::UnorderedElementsAre;
using namespace vclink::test;

/// Each is the name of one file; every one is a decoy for the others.
const std::vector<std::string> hardNames{"a",
                                         "b",
                                         "#a",
                                         "!b",
                                         "#notes#",
                                         "!",
                                         "#",
                                         "##a",
                                         "!!b",
                                         " a",
                                         "a b",
                                         "a ",
                                         "a  ",
                                         " ",
                                         "a\t",
                                         "a\r",
                                         "a\n",
                                         "a\v",
                                         "a\f",
                                         "a\nb",
                                         "# ",
                                         "! a ",
                                         "-a",
                                         "--all",
                                         ":a",
                                         ":!a",
                                         ":(top)a",
                                         "^a",
                                         "~a",
                                         "{a,b}",
                                         "a]",
                                         ".a",
                                         "...",
                                         "..a",
                                         "a'b",
                                         "\"a\"",
                                         "$HOME",
                                         "\x01",
                                         "\x7F",
                                         "\xC3\xBC",
                                         "u\xCC\x88",
                                         "\xE6\x97\xA5\xE6\x9C\xAC",
                                         "\xF0\x9F\x98\x80",
                                         "\xFF",
                                         "a\xFF ",
                                         "\xED\xA0\x80",
                                         "\xC2\xA0",
                                         "d/#a",
                                         "d/a ",
                                         "d /a",
                                         "#d/a",
                                         "d/\xFF"};

class StagedNames : public StagingFixture
{
  protected:
    void writeAll(const std::vector<std::string> &names, const std::string &content) const
    {
        for (const auto &name : names)
            repository_.write(name, content);
    }

    /// What an index would be after git ran once for this name.
    RepositoryState::Entries indexAfterGit(const std::vector<std::string> &command,
                                           const std::vector<std::string> &names) const
    {
        std::vector<std::string> arguments{"--literal-pathspecs"};
        arguments.insert(arguments.end(), command.begin(), command.end());
        arguments.emplace_back("--");
        arguments.insert(arguments.end(), names.begin(), names.end());
        const std::string before = repository_.read(".git/index");
        repository_.git(arguments);
        const auto entries = indexOf(repository_);
        repository_.write(".git/index", before);
        return entries;
    }
    /// Expects of each name, or of each with those that follow it, what git makes of the index.
    void expectEachAsGit(const std::vector<std::string> &command,
                         const std::function<void(const std::vector<std::string> &)> &action,
                         std::ptrdiff_t count = 1) const
    {
        const std::string before = repository_.read(".git/index");
        for (auto name = hardNames.begin(); hardNames.end() - name >= count; ++name)
        {
            const std::vector<std::string> names(name, name + count);
            const auto expected = indexAfterGit(command, names);
            EXPECT_NE(expected, indexOf(repository_));
            action(names);
            EXPECT_EQ(indexOf(repository_), expected) << testing::PrintToString(names);
            repository_.write(".git/index", before);
        }
    }
};

TEST_F(StagedNames, AreAddedAloneAndTogether)
{
    writeAll(hardNames, "x");
    expectEachAsGit({"add"}, [this](const auto &names) { add(names); });
    const auto expected = indexAfterGit({"add"}, hardNames);
    add(hardNames);
    EXPECT_EQ(indexOf(repository_), expected);
    EXPECT_EQ(expected.size(), hardNames.size() + 3);
}

TEST_F(StagedNames, AreRemovedAloneAndInPairs)
{
    writeAll(hardNames, "x");
    repository_.commitAll("second");
    const auto removing = [this](const auto &names) { remove(names); };
    expectEachAsGit({"rm", "--quiet", "--cached"}, removing);
    expectEachAsGit({"rm", "--quiet", "--cached"}, removing, 2);
}

TEST_F(StagedNames, AreMarkedAsResolvedAlone)
{
    beginMerge(hardNames);
    writeAll(hardNames, "merged");
    expectEachAsGit({"add"}, [this](const auto &names) { markResolved(names.front()); });
}

TEST_F(StagedNames, AreRevertedAlone)
{
    writeAll(hardNames, "x");
    repository_.commitAll("second");
    const auto committed = indexOf(repository_);
    writeAll(hardNames, "edited");
    repository_.git({"add", "--all"});
    const auto edited = indexOf(repository_);
    const std::string before = repository_.read(".git/index");
    for (const auto &name : hardNames)
    {
        auto expected = edited;
        expected.at(name) = committed.at(name);
        revert({name});
        EXPECT_EQ(indexOf(repository_), expected) << testing::PrintToString(name);
        for (const auto &other : hardNames)
        {
            EXPECT_EQ(repository_.read(other), other == name ? "x" : "edited")
                << testing::PrintToString(other) << " by " << testing::PrintToString(name);
        }
        repository_.write(name, "edited");
        repository_.write(".git/index", before);
    }
}

TEST_F(StagedNames, StandInTheReportsAsTheyAre)
{
    beginMerge(hardNames);
    const NothingChanges nothing(repository_);
    for (const auto &name : hardNames)
    {
        expectRefusal<AlreadyAdded>(inRoot({name}), [&] { add({name}); });
        expectRefusal<Conflicted>(inRoot({name}), [&] { revert({name}); });
    }
}

TEST_F(StagedNames, ThatBeginDangerouslyMeanTheFilesOfAList)
{
    writeAll({"#a", "!b", "a", "b"}, "x");
    add({"#a", "!b"});
    EXPECT_THAT(status(), ElementsAre("A  !b", "A  #a", "?? a", "?? b"));
    repository_.commitAll("second");
    writeAll({"#a", "!b", "a", "b"}, "edited");
    revert({"!b", "#a"});
    EXPECT_THAT(status(), ElementsAre(" M a", " M b"));
    remove({"#a", "!b"});
    EXPECT_THAT(status(), ElementsAre("D  !b", "D  #a", " M a", " M b", "?? !b", "?? #a"));
}

/// The empty path, the root, what is elsewhere or nowhere, and folders with a dangerous name, of
/// which only the entry itself is meant: that is the limit of what a list can say.
TEST_F(StagedNames, OfNothingAreTakenForNothingAlsoBesideAFile)
{
    writeAll({"#dir/a", "!dir/a", "dir /a"}, "x");
    repository_.commitAll("second");
    writeAll({"#dir/a", "!dir/a", "dir /a", "file", "other", "#new/a", "!new/a", "new /a", "new",
              "../outside"},
             "edited");
    repository_.add({"other"});
    const std::string root = repository_.path();
    std::vector<upath> paths{upath()};
    for (const std::string &path : {root, root + "/.", std::string("missing/relative"),
                                    std::string("/"), std::string("/new"), std::string("/*")})
        paths.push_back(asPath(path));
    const auto adapter = makeAdapter(root);
    const RepositoryState before = stateOf(repository_);
    for (const auto &path : paths)
        adapter->markResolved(path);
    for (const auto &path : files({"missing", "missing/below", "file/below", "../outside", "#dir",
                                   "!dir", "dir ", "#new", "!new", "new "}))
        paths.push_back(path);
    for (const auto &path : paths)
    {
        SCOPED_TRACE(asBytes(path));
        adapter->addFiles({path});
        EXPECT_THROW(adapter->removeFiles({path}), vclink::git::TagException<NoFilesToRemove>);
        adapter->revertFiles({path});
    }
    EXPECT_EQ(stateOf(repository_), before);
    const auto besides = [&](const std::string &name)
    {
        std::vector<upath> more = paths;
        more.push_back(asPath(root + '/' + name));
        return more;
    };
    adapter->addFiles(besides("new"));
    adapter->removeFiles(besides("sub/inside"));
    adapter->revertFiles(besides("file"));
    EXPECT_THAT(status(), UnorderedElementsAre(" M !dir/a", " M #dir/a", "A  new", " M dir /a",
                                               "M  other", "D  sub/inside", "?? !new/a",
                                               "?? #new/a", "?? new /a", "?? sub/inside"));
}

/// Names with wildcard characters, which act as patterns.
class StagedPatterns : public StagedNames
{
  protected:
    StagedPatterns()
    {
        writeAll({"a[1].txt", "a1.txt", "q?", "qx", "s*", "sx", "t"}, "x");
    }
};

TEST_F(StagedPatterns, AddWhatTheyMatch)
{
    add({"a[1].txt"});
    EXPECT_THAT(status(), ElementsAre("A  a1.txt", "A  a[1].txt", "?? q?", "?? qx", "?? s*",
                                      "?? sx", "?? t"));
    add({"q?"});
    EXPECT_THAT(status(), ElementsAre("A  a1.txt", "A  a[1].txt", "A  q?", "A  qx", "?? s*",
                                      "?? sx", "?? t"));
}

TEST_F(StagedPatterns, AreRefusedForWhatTheyMatch)
{
    repository_.add({"a1.txt"});
    const NothingChanges nothing(repository_);
    expectRefusal<AlreadyAdded>(inRoot({"a1.txt"}), [this] { add({"a[1].txt"}); });
}

TEST_F(StagedPatterns, RemoveWhatTheyMatch)
{
    repository_.commitAll("second");
    remove({"a[1].txt", "s*"});
    EXPECT_THAT(status(),
                ElementsAre("D  a1.txt", "D  a[1].txt", "D  s*", "D  sub/inside", "D  sx",
                            "?? a1.txt", "?? a[1].txt", "?? s*", "?? sub/inside", "?? sx"));
}

TEST_F(StagedPatterns, RevertWhatTheyMatch)
{
    repository_.commitAll("second");
    writeAll({"a[1].txt", "a1.txt", "q?", "qx", "t"}, "edited");
    revert({"a[1].txt", "q?"});
    EXPECT_THAT(status(), ElementsAre(" M t"));
}

TEST_F(StagedPatterns, ResolveWhatTheyMatch)
{
    repository_.commitAll("second");
    writeAll({"a[1].txt", "a1.txt", "t"}, "edited");
    markResolved("a[1].txt");
    EXPECT_THAT(status(), ElementsAre("M  a1.txt", "M  a[1].txt", " M t"));
}

/// A backslash in a name turns into a slash, so the name means another file.
TEST_F(StagedPatterns, DoNotComeOfABackslash)
{
    writeAll({"x\\y", "x/y"}, "x");
    add({"x\\y"});
    EXPECT_THAT(status(), testing::Contains("A  x/y"));
    EXPECT_THAT(status(), testing::Contains("?? x\\y"));
}

} // namespace
