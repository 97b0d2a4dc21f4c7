// SPDX-License-Identifier: MIT
#include "main/checkout/overlookedEdits.hpp"

#include <filesystem>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"

namespace
{

using testing::IsEmpty;
using namespace vclink::test;

/// Changes of the user that libgit2 takes for none, in the way of a switch and a fast-forward.
class OverlookedEdits : public ObstacleFixture
{
  protected:
    void expectRefused(const Failure &failure) const override
    {
        expectSwitchRefused(failure);
        expectMergeRefused(failure);
    }
    void expectRefusedUnprivileged(const std::string &name, mode_t mode,
                                   const Failure &failure) const
    {
        EXPECT_EQ(runUnprivileged(
                      name, mode,
                      [this]
                      { return failureOf([this] { branches().switchBranch("topic"); }).text; }),
                  failure.text);
        EXPECT_EQ(runUnprivileged(name, mode, [this] { return failureOfMerge("topic"); }),
                  textOf(failure));
    }
};

Failure lost(const std::string &name)
{
    return refusal("the uncommitted changes of '" + name + "' would be lost in the checkout");
}

TEST_F(OverlookedEdits, OfTheSameSizeAndTimeAreKept)
{
    makeBranch("topic", writes("d/f", "t\n") + removes("d/g"));
    for (const std::string name : {"d/f", "d/g"})
    {
        SCOPED_TRACE(name);
        setsAnOldTime(name)(repository_);
        repository_.git({"update-index", "--refresh"});
        writesAtTheSameTime(name, "M\n")(repository_);
        expectRefused(lost(name));
        repository_.git({"checkout", "--quiet", "--force", "HEAD", "--", name});
        writes(name, name == "d/f" ? "f\n" : "g\n")(repository_);
    }
    expectSwitches();
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(OverlookedEdits, AreNotOtherInodesWithTheSameContent)
{
    makeBranch("topic", writes("d/f", "t\n") + removes("d/g"));
    for (const std::string name : {"d/f", "d/g"})
    {
        setsAnOldTime(name)(repository_);
        repository_.git({"update-index", "--refresh"});
        const std::string content = repository_.read(name);
        repository_.remove(name);
        repository_.write(name, content);
        setsAnOldTime(name)(repository_);
    }
    expectSwitches();
    EXPECT_THAT(status(), IsEmpty());
}

/// As after a copy of a working copy with its times. What git stores is not what the file holds.
TEST_F(OverlookedEdits, AreNotOtherInodesOfFilteredFiles)
{
    repository_.git({"config", "filter.large.clean", "tr a-z A-Z"});
    repository_.git({"config", "filter.large.smudge", "tr A-Z a-z"});
    repository_.commitAll(writes(".gitattributes", "/d/f filter=large\n"), "attributes");
    repository_.commitAll(writes("d/f", "large\n"), "filtered");
    makeBranch("topic", writes("d/f", "other\n"));
    for (const std::string command : {"clean", "process"})
    {
        SCOPED_TRACE(command);
        repository_.git({"config", "filter.large.clean", "tr a-z A-Z"});
        repository_.git({"checkout", "--quiet", "--force", "main"});
        setsAnOldTime("d/f")(repository_);
        repository_.git({"update-index", "--refresh"});
        writesAtTheSameTime("d/f", "large\n")(repository_);
        repository_.git({"config", "--unset", "filter.large.clean"});
        repository_.git({"config", "filter.large." + command, "tr a-z A-Z"});
        expectSwitches();
        repository_.git({"config", "--unset", "filter.large." + command});
    }
}

TEST_F(OverlookedEdits, AreNotOtherInodesOfFilesWithAnotherEncoding)
{
    repository_.commitAll(writes(".gitattributes", "/d/f working-tree-encoding=latin1\n") +
                              writes("d/f", "\xE4\n"),
                          "encoded");
    makeBranch("topic", writes("d/f", "\xF6\n"));
    setsAnOldTime("d/f")(repository_);
    repository_.git({"update-index", "--refresh"});
    writesAtTheSameTime("d/f", "\xE4\n")(repository_);
    expectSwitches();
}

/// git stores what these files hold.
TEST_F(OverlookedEdits, OfFilesThatNoCommandConvertsAreKept)
{
    repository_.git({"config", "filter.empty.clean", ""});
    repository_.git({"config", "filter.empty.process", ""});
    repository_.git({"config", "filter.smudged.smudge", "cat"});
    repository_.git({"config", "filter.lax.required", "false"});
    makeBranch("topic", writes("d/f", "t\n"));
    setsAnOldTime("d/f")(repository_);
    repository_.git({"update-index", "--refresh"});
    // git does not notice another time of the inode within a second.
    repository_.write("n", "M\n");
    setsAnOldTime("n")(repository_);
    std::filesystem::rename(repository_ / "n", repository_ / "d/f");
    for (const std::string attribute :
         {"filter", "filter=", "filter=unknown", "filter=empty", "filter=smudged", "filter=lax",
          "working-tree-encoding=UTF-8", "working-tree-encoding=utf-8",
          "working-tree-encoding=Utf8", "working-tree-encoding="})
    {
        SCOPED_TRACE(attribute);
        repository_.write(".git/info/attributes", "/d/f " + attribute + '\n');
        expectRefused(lost("d/f"));
        EXPECT_NE(repository_.tryGit({"switch", "topic"}).exitStatus, 0);
    }
}

/// As on a file system without symbolic links. libgit2 refuses these itself, edited or not.
TEST_F(OverlookedEdits, AreNotPlainFilesInThePlaceOfLinks)
{
    repository_.commitAll(links("f", "d/link"), "a link");
    makeBranch("topic", links("g", "d/link"));
    repository_.git({"config", "core.symlinks", "false"});
    repository_.remove("d/link");
    repository_.write("d/link", "f");
    setsAnOldTime("d/link")(repository_);
    repository_.git({"update-index", "--refresh"});
    writesAtTheSameTime("d/link", "f")(repository_);
    expectRefused(refusal("1 conflict prevents checkout"));
}

/// Line ends, also in a file that is not a text, and `$Id$`: git compares the size first.
TEST_F(OverlookedEdits, ThatConversionHidesAreKept)
{
    struct Case
    {
        std::string attributes;
        std::string committed;
        std::string edited;
    };
    const std::vector<Case> cases{
        {"text", "a\nb\n", "a\r\nb\n"},
        {"text", std::string("a\0\nb\n", 5), std::string("a\0\r\nb\n", 6)},
        {"text eol=crlf", "a\nb\n", "a\r\nb\n"},
        {"ident", "$Id$\n", "$Id: mine $\n"}};
    for (const auto &[attributes, committed, edited] : cases)
    {
        SCOPED_TRACE(attributes + ": " + edited);
        repository_.commitAll(writes(".gitattributes", "/d/? " + attributes + '\n') +
                                  writesEach({"d/f", "d/g"}, committed),
                              "converted");
        makeBranch("topic", writes("d/f", "t\n") + removes("d/g"));
        for (const std::string name : {"d/f", "d/g"})
        {
            SCOPED_TRACE(name);
            repository_.write(name, edited);
            expectRefused(lost(name));
            EXPECT_EQ(repository_.read(name), edited);
            EXPECT_NE(repository_.tryGit({"switch", "topic"}).exitStatus, 0);
            repository_.remove(name);
            repository_.git({"checkout", "--quiet", "--", name});
        }
        repository_.git({"branch", "--quiet", "-D", "topic"});
    }
}

/// libgit2 takes the file for what it would write, which has other line ends.
TEST_F(OverlookedEdits, WithOtherLineEndsThanTheTargetsAreKept)
{
    repository_.commitAll(writes(".gitattributes", "/d/f text\n") + writes("d/f", "a\nb\n"),
                          "converted");
    makeBranch("topic", writes("d/f", "t\n"));
    repository_.write("d/f", "t\r\n");
    expectRefused(lost("d/f"));
    EXPECT_NE(repository_.tryGit({"switch", "topic"}).exitStatus, 0);
    repository_.write("d/f", "t\n");
    expectSwitches();
    EXPECT_THAT(status(), IsEmpty());
}

/// As git takes them for unchanged: with line ends converted, copied, and with other times.
TEST_F(OverlookedEdits, AreNotConvertedFilesOfTheirRecordedSize)
{
    const std::vector<Change> changes{
        [](const GitRepository & /*copy*/) {},
        setsAnOldTime("d/f"),
        removes("d/f") + runsGit({"checkout", "--quiet", "--", "d/f"}),
        removes("d/f") + writes("d/f", "f\r\nf\r\n"),
        writes("d/f", "f\nf\n") + runsGit({"add", "--renormalize", "d/f"}),
        runsGit({"rm", "--quiet", "--cached", "d/f"}) + runsGit({"reset", "--quiet"}),
        runsGit({"read-tree", "HEAD"})};
    repository_.git({"config", "core.autocrlf", "true"});
    repository_.commitAll(writes("d/f", "f\r\nf\r\n"), "converted");
    makeBranch("topic", writes("d/f", "t\r\n"));
    for (std::size_t i = 0; i < changes.size(); ++i)
    {
        SCOPED_TRACE(i);
        changes[i](repository_);
        const GitRepository twin = repository_.copyTo(folder() / "twin");
        twin.git({"switch", "--quiet", "topic"});
        expectSwitches();
        EXPECT_EQ(repository_.read("d/f"), twin.read("d/f"));
        EXPECT_THAT(status(), IsEmpty());
        repository_.git({"switch", "--quiet", "main"});
    }
}

TEST_F(OverlookedEdits, OfFilesThatCannotBeReadAreKept)
{
    makeBranch("topic", writes("d/f", "theirs\n") + removes("d/g"));
    for (const std::string name : {"d/f", "d/g"})
    {
        SCOPED_TRACE(name);
        const std::string before = repository_.read(name);
        repository_.write(name, "mine\n");
        expectRefusedUnprivileged(
            name, 0200,
            refusal("'" + name +
                    "' cannot be read, and its changes would be lost in the checkout"));
        EXPECT_EQ(repository_.read(name), "mine\n");
        repository_.write(name, before);
    }
}

/// Staged, in the place of what the other branch adds.
TEST_F(OverlookedEdits, OfStagedFilesThatAreIgnoredAreKept)
{
    ignore("*.log\nlogs");
    makeBranch("topic", writesEach({"x.log", "logs"}, "theirs\n") +
                            runsGit({"add", "--force", "x.log", "logs"}));
    const Change adds = writes("x.log", "mine\n") + runsGit({"add", "--force", "x.log"});
    adds(repository_);
    expectRefused(staged("x.log"));
    repository_.git({"reset", "--quiet"});
    (writes("x.log", "theirs\n") + runsGit({"add", "--force", "x.log"}) +
     writes("x.log", "mine\n"))(repository_);
    expectRefused(staged("x.log"));
    EXPECT_EQ(repository_.read("x.log"), "mine\n");
    repository_.git({"rm", "--quiet", "--force", "x.log"});
    (writes("logs/mine", "mine\n") + runsGit({"add", "--force", "logs/mine"}))(repository_);
    expectRefused(staged("logs"));
    EXPECT_EQ(repository_.read("logs/mine"), "mine\n");
}

TEST_F(OverlookedEdits, AreFoldersInThePlaceOfATrackedFileThatIsIgnored)
{
    ignore("d/");
    makeBranch("topic", writes("d/f", "theirs\n") + runsGit({"add", "--force", "d/f"}));
    repository_.remove("d/f");
    repository_.write("d/f/mine", "mine\n");
    expectRefused(inTheWay("folder 'd/f'"));
    EXPECT_EQ(repository_.read("d/f/mine"), "mine\n");
}

TEST_F(OverlookedEdits, AreNotStagedFilesThatTheBranchHasAsWell)
{
    ignore("*.log");
    makeBranch("topic", writes("x.log", "theirs\n") + runsGit({"add", "--force", "x.log"}));
    (writes("x.log", "theirs\n") + runsGit({"add", "--force", "x.log"}))(repository_);
    expectSwitches();
    EXPECT_THAT(status(), IsEmpty());
}

} // namespace
