// SPDX-License-Identifier: MIT
#include <filesystem>
#include <functional>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeFixture.hpp"

namespace
{

using testing::ElementsAre;
using vclink::test::GitRepository;

/// Conflicts of a rarer kind: which are as in git, and which libgit2 sees otherwise.
class RareConflicts : public vclink::test::MergeFixture
{
  protected:
    std::function<void()> linking(const std::string &target, const std::string &name) const
    {
        return [=]
        {
            std::filesystem::remove(repository_ / name);
            repository_.symlink(target, name);
        };
    }
    /// Expects these conflicts and files, and something else of git. "~theirs" behind a name stands
    /// for the id of the branch.
    void expectUnlikeGit(const std::vector<std::string> &stages, std::vector<std::string> files)
    {
        const auto byGit = outcomeByGit("topic");
        const auto outcome = outcomeByLibrary("topic");
        EXPECT_FALSE(outcome == byGit);
        EXPECT_EQ(conflicts(), stages);
        const std::string theirs = "~theirs";
        for (auto &file : files)
        {
            const auto at = file.find(theirs);
            if (at != std::string::npos)
                file.replace(at + 1, theirs.size() - 1, idOf("topic"));
        }
        std::vector<std::string> standing;
        for (const auto &[name, content] : outcome.workingTree)
            standing.push_back(name);
        EXPECT_THAT(standing, testing::UnorderedElementsAreArray(files));
    }
};

TEST_F(RareConflicts, OfSymbolicLinks)
{
    linking("file", "link")();
    repository_.commitAll("link");
    diverge(linking("ours", "link"), linking("theirs", "link"));
    expectAsGit();
}

/// git puts our file beside the link.
TEST_F(RareConflicts, OfAFileAndALink)
{
    diverge(writing("file", "ours\n"), linking("other", "file"));
    expectUnlikeGit({"1 file", "2 file", "3 file"}, {"file", "other"});
    EXPECT_EQ(repository_.read("file"), "ours\n");
}

/// git puts our file beside the link.
TEST_F(RareConflicts, OfANewFileAndANewLink)
{
    diverge(writing("new", "ours\n"), linking("other", "new"));
    expectUnlikeGit({"2 new", "3 new"}, {"file", "new", "other"});
    EXPECT_EQ(repository_.read("new"), "ours\n");
}

/// git's index has the file under its new name, too.
TEST_F(RareConflicts, OfAFileAndAFolder)
{
    diverge(writing("new", "ours\n"), writing("new/inside", "theirs\n"));
    expectUnlikeGit({"2 new"}, {"file", "new", "new/inside", "new~HEAD", "other"});
}

/// git's index has the file under its new name, too.
TEST_F(RareConflicts, OfAFolderAndAFile)
{
    diverge(writing("new/inside", "ours\n"), writing("new", "theirs\n"));
    expectUnlikeGit({"3 new"}, {"file", "new", "new/inside", "new~theirs", "other"});
}

TEST_F(RareConflicts, OfTwoNamesForOneFile)
{
    diverge(moving("file", "ours"), moving("file", "theirs"));
    expectAsGit();
}

/// git has both stages under the new name.
TEST_F(RareConflicts, OfARenameAndADeletion)
{
    diverge(moving("file", "moved"), [this] { repository_.remove("file"); });
    expectUnlikeGit({"1 file", "2 moved"}, {"moved", "other"});
}

/// git has both stages under the new name.
TEST_F(RareConflicts, OfADeletionAndARename)
{
    diverge([this] { repository_.remove("file"); }, moving("file", "moved"));
    expectUnlikeGit({"1 file", "3 moved"}, {"moved", "other"});
}

/// git writes both into one file, with markers.
TEST_F(RareConflicts, OfTwoFilesRenamedToOneName)
{
    diverge(moving("file", "moved"), moving("other", "moved"));
    expectUnlikeGit({"1 file", "3 file", "2 moved", "3 moved", "1 other", "2 other"},
                    {"moved~HEAD", "moved~theirs"});
}

/// git writes both into one file, with markers.
TEST_F(RareConflicts, OfARenameAndANewFileOfTheName)
{
    diverge(moving("file", "moved"), writing("moved", "theirs\n"));
    expectUnlikeGit({"1 file", "3 file", "2 moved", "3 moved"},
                    {"moved~HEAD", "moved~theirs", "other"});
}

/// For git a conflict; libgit2 takes the executable one.
TEST_F(RareConflicts, OfNewFilesWithDifferentModes)
{
    diverge(writing("new", "same\n"),
            [this]
            {
                repository_.write("new", "same\n");
                repository_.setMode("new", 0755);
            });
    expectUnlikeGit({}, {"file", "new", "other"});
    EXPECT_EQ(repository_.git({"ls-files", "--stage", "new"}).substr(0, 6), "100755");
}

TEST_F(RareConflicts, OfCaseOnlyRenamesOfBothSides)
{
    diverge(moving("file", "File"), moving("file", "FILE"));
    expectAsGit();
}

/// git suspects that the new file belongs into the renamed folder; libgit2 leaves it.
TEST_F(RareConflicts, OfAFolderThatTheyRenamed)
{
    for (const std::string name : {"folder/a", "folder/b", "folder/c"})
        writing(name, "content of " + name + "\n1\n2\n3\n")();
    repository_.commitAll("folder");
    diverge(writing("folder/new", "x\n"), moving("folder", "moved"));
    expectUnlikeGit(
        {}, {"file", "folder", "folder/new", "moved", "moved/a", "moved/b", "moved/c", "other"});
}

TEST_F(RareConflicts, OfASubmodule)
{
    auto inner = addModule();
    const std::string base = inner.line({"rev-parse", "HEAD"});
    inner.git({"checkout", "--quiet", "-b", "ours"});
    inner.commitAll("ours");
    inner.git({"checkout", "--quiet", "-b", "theirs", base});
    inner.commitAll("theirs");
    const GitRepository module(repository_ / "module");
    module.git({"fetch", "--quiet"});
    const auto moveModule = [&module](const std::string &name) {
        return [&module, name] { module.git({"checkout", "--quiet", "origin/" + name}); };
    };
    makeBranch("topic", moveModule("theirs"));
    repository_.git({"submodule", "--quiet", "update"});
    moveModule("ours")();
    repository_.commitAll("on main");
    const auto expected = outcomeByGit("topic");
    const auto outcome = outcomeByLibrary("topic");
    EXPECT_EQ(outcome.index, expected.index);
    EXPECT_EQ(outcome.mergeHead, expected.mergeHead);
}

TEST_F(RareConflicts, OfCrissCrossHistories)
{
    diverge(writing("other", "ours 1\n"), writing("file", "theirs 1\n"));
    crissCross(writing("file", "ours 2\n"), writing("file", "theirs 2\n"));
    expectAsGit();
    EXPECT_THAT(conflicts(), ElementsAre("1 file", "2 file", "3 file"));
}

/// For these, git keeps our file and libgit2 writes markers, unless they are no text besides.
TEST_F(RareConflicts, OfFilesThatAreMergedAsBinary)
{
    repository_.write(".gitattributes", "file merge=binary\n");
    repository_.commitAll("attributes");
    diverge(writing("file", "ours\n"), writing("file", "theirs\n"));
    const auto expected = outcomeByGit("topic");
    const auto outcome = outcomeByLibrary("topic");
    EXPECT_EQ(outcome.index, expected.index);
    EXPECT_THAT(expected.workingTree.at("file"), testing::HasSubstr("644 ours\n"));
    EXPECT_THAT(outcome.workingTree.at("file"), testing::HasSubstr("<<<<<<< \nours\n=======\n"));
}

/// libgit2 drops what the driver wrote and writes markers; git keeps the driver's file.
TEST_F(RareConflicts, OfADriverThatAnswersConflict)
{
    repository_.write(".gitattributes", "file merge=half\n");
    repository_.commitAll("attributes");
    const GitRepository outside(folder() / "tools");
    outside.write("half", "#!/bin/sh\necho half >\"$1\"\nexit 1\n");
    outside.setMode("half", 0755);
    repository_.git({"config", "merge.half.driver", (outside / "half").string() + " %A"});
    diverge(writing("file", "ours\n"), writing("file", "theirs\n"));
    const auto expected = outcomeByGit("topic");
    const auto outcome = outcomeByLibrary("topic");
    EXPECT_EQ(outcome.index, expected.index);
    EXPECT_EQ(expected.workingTree.at("file"), "644 half\n");
    EXPECT_THAT(outcome.workingTree.at("file"), testing::HasSubstr("<<<<<<< \nours\n=======\n"));
}

} // namespace
