// SPDX-License-Identifier: MIT
// Tracked files that are empty now and are converted as they are read. Before libgit2 1.6 its
// comparison of such a file ends the process: each operation runs in a child process.
#include <filesystem>
#include <functional>
#include <ostream>
#include <string>
#include <utility>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "CommitFixture.hpp"
#include "support/ChildProcess.hpp"

namespace
{

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Not;
using namespace vclink::test;

class EmptiedFiles : public CommitFixture
{
  protected:
    /// The failure of an operation in a process of its own; empty if it succeeds.
    static std::string endOf(const std::function<void()> &operation)
    {
        return runInChild(
            [&]
            {
                operation();
                return std::string();
            });
    }
    void commitAttributes(const std::string &attributes = "* text\n")
    {
        repository_.commitAll(writes(".gitattributes", attributes), "attributes");
    }
    /// Commits, and expects what git makes of the same.
    void expectCommittedAsByGit() const
    {
        const RepositoryState expected = stateAfterGit({{"add", "--update"}});
        EXPECT_EQ(endOf([this] { commit(); }), "");
        EXPECT_EQ(indexOf(repository_), expected.index);
        EXPECT_EQ(idOf("HEAD^{tree}") + '\n', repository_.git({"write-tree"}));
        EXPECT_EQ(repository_.git({"fsck", "--strict", "--no-dangling"}), "");
    }
    /// Adds a file or marks it as resolved, and expects what git makes of the same.
    void expectAddedAsByGit(const std::vector<std::string> &names) const
    {
        std::vector<std::string> command{"add", "--"};
        command.insert(command.end(), names.begin(), names.end());
        const RepositoryState expected = stateAfterGit({command});
        EXPECT_EQ(endOf([&] { add(names); }), "");
        EXPECT_EQ(stateOf(repository_), expected);
    }
    void expectResolvedAsByGit(const std::string &name) const
    {
        const RepositoryState expected = stateAfterGit({{"add", "--", name}});
        EXPECT_EQ(endOf([&] { markResolved(name); }), "");
        EXPECT_EQ(stateOf(repository_), expected);
    }
};

TEST_F(EmptiedFiles, AreCommittedWithAChangeOfTheAttributesThemselves)
{
    commitAttributes();
    repository_.write(".gitattributes", "* text=auto\n");
    repository_.write("file", "");
    expectCommittedAsByGit();
    repository_.write(".gitattributes", "");
    repository_.write("other", "");
    expectCommittedAsByGit();
}

TEST_F(EmptiedFiles, AreCommittedWhereOnlyTheModeOfAnEmptyFileIsAnother)
{
    repository_.write("empty", "");
    commitAttributes();
    repository_.setMode("empty", 0755);
    expectCommittedAsByGit();
    EXPECT_EQ(repository_.git({"ls-tree", "HEAD", "empty"}).substr(0, 6), "100755");
}

TEST_F(EmptiedFiles, AreCommittedWhereNoModesAreKept)
{
    repository_.write("empty", "");
    commitAttributes();
    repository_.git({"config", "core.fileMode", "false"});
    repository_.setMode("empty", 0755);
    repository_.setMode("file", 0755);
    repository_.write("file", "");
    expectCommittedAsByGit();
}

TEST_F(EmptiedFiles, AreNotCommittedWhereTheyAreAssumedUnchangedOrNotCheckedOut)
{
    commitAttributes();
    repository_.git({"update-index", "--assume-unchanged", "file"});
    repository_.git({"update-index", "--skip-worktree", "other"});
    repository_.write("file", "");
    repository_.write("other", "");
    repository_.write("sub/inside", "");
    expectCommittedAsByGit();
    EXPECT_NE(committed("file"), "");
    EXPECT_EQ(committed("sub/inside"), "");
}

TEST_F(EmptiedFiles, BehindALinkAreNotCommitted)
{
    commitAttributes();
    std::filesystem::rename(repository_ / "sub", repository_ / "moved");
    repository_.symlink("moved", "sub");
    repository_.write("moved/inside", "");
    repository_.write("file", "");
    EXPECT_EQ(endOf([this] { commit(); }), "");
    EXPECT_THAT(namesIn(), ElementsAre(".gitattributes", "file", "other"));
    EXPECT_EQ(committed("file"), "");
}

TEST_F(EmptiedFiles, ThatWereLinksAreCommitted)
{
    repository_.symlink("file", "link");
    repository_.symlink("file", "kept");
    commitAttributes();
    repository_.remove("link");
    repository_.write("link", "");
    expectCommittedAsByGit();
    repository_.git({"config", "core.symlinks", "false"});
    repository_.remove("kept");
    repository_.write("kept", "");
    expectCommittedAsByGit();
}

TEST_F(EmptiedFiles, AreCommittedOfAConflict)
{
    commitAttributes();
    beginMerge({"file", "other"});
    repository_.write("file", "");
    repository_.write("other", "");
    repository_.write("sub/inside", "");
    expectResolvedAsByGit("file");
    expectCommittedAsByGit();
    EXPECT_EQ(parents().size(), 2U);
}

/// git's next commit would delete them.
TEST_F(EmptiedFiles, OnlyIntendedToBeAddedAreCommittedWithoutThatMark)
{
    repository_.write("intended", "");
    repository_.git({"add", "--intent-to-add", "intended"});
    commit();
    repository_.git({"commit", "--quiet", "--allow-empty", "--message=next"});
    EXPECT_EQ(repository_.git({"ls-tree", "--name-only", "HEAD", "intended"}), "intended\n");
}

TEST_F(EmptiedFiles, FailAsBeforeWhereAnotherFileFails)
{
    commitAttributes();
    repository_.git({"config", "core.safecrlf", "true"});
    repository_.write("file", "");
    repository_.write("other", "a\r\nb\n");
    const NothingChanges nothing(repository_);
    EXPECT_THAT(endOf([this] { commit(); }),
                testing::HasSubstr("CRLF would be replaced by LF in 'other'"));
}

TEST_F(EmptiedFiles, WithNamesThatAreEscapedStayOutOfAnAddition)
{
    const std::vector<std::string> names{"#a", "!b", " c", "d ", "e\\f", "[g]", "h*", "?", "-i"};
    for (const auto &name : names)
        repository_.write(name, "content of " + name + "\n");
    commitAttributes();
    for (const auto &name : names)
        repository_.write(name, "");
    repository_.git({"update-index", "--assume-unchanged", "--", "#a", "e\\f"});
    repository_.write("new", "x");
    expectAddedAsByGit({"new"});
    expectResolvedAsByGit("!b");
    expectResolvedAsByGit(" c");
    expectCommittedAsByGit();
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(EmptiedFiles, InAFolderThatIsMarkedAsResolvedAreStaged)
{
    commitAttributes();
    repository_.write("sub/inside", "");
    repository_.write("file", "");
    expectResolvedAsByGit("sub");
}

TEST_F(EmptiedFiles, LoseNoEntryBesideThem)
{
    repository_.write("#folder/file", "x");
    repository_.write(" first", "x");
    commitAttributes();
    repository_.remove("#folder");
    repository_.write("#folder", "instead");
    markResolved("#folder");
    const auto staged = split(repository_.git({"ls-files"}));
    EXPECT_THAT(staged, Contains("#folder"));
    EXPECT_THAT(staged, Not(Contains("#folder/file")));
    repository_.write("#folder", "");
    repository_.write("new", "x");
    const auto before = indexOf(repository_);
    EXPECT_EQ(endOf([this] { add({"new"}); }), "");
    auto after = indexOf(repository_);
    EXPECT_EQ(after.erase("new"), 1U);
    EXPECT_EQ(after, before);
    expectCommittedAsByGit();
    EXPECT_THAT(
        split(repository_.git({"ls-files"})),
        ElementsAre(" first", "#folder", ".gitattributes", "file", "new", "other", "sub/inside"));
}

/// What converts files, and their content before.
struct Conversion
{
    const char *name;
    std::string attributes;
    std::vector<std::pair<std::string, std::string>> settings;
    std::string content = "one\r\ntwo\r\n";
};

void PrintTo(const Conversion &conversion, std::ostream *stream)
{
    *stream << conversion.name;
}

class EmptiedFilesUnder : public EmptiedFiles, public testing::WithParamInterface<Conversion>
{
  protected:
    EmptiedFilesUnder()
    {
        for (const auto &[name, value] : GetParam().settings)
            repository_.git({"config", name, value});
        repository_.write("file", GetParam().content);
        repository_.write("sub/inside", GetParam().content);
        repository_.write("empty", "");
        commitAttributes(GetParam().attributes);
        repository_.write("file", "");
        repository_.write("sub/inside", "");
        repository_.remove("other");
        repository_.write("new", "");
    }
};

TEST_P(EmptiedFilesUnder, AreCommitted)
{
    expectCommittedAsByGit();
    EXPECT_EQ(committed("file"), "");
    EXPECT_THAT(status(), ElementsAre("?? new"));
}

TEST_P(EmptiedFilesUnder, StayOutOfAnAddition)
{
    expectAddedAsByGit({"new"});
    EXPECT_THAT(status(), ElementsAre(" M file", "A  new", " D other", " M sub/inside"));
}

TEST_P(EmptiedFilesUnder, AreStagedWhereTheyAreMarkedAsResolved)
{
    expectResolvedAsByGit("file");
    EXPECT_THAT(status(), ElementsAre("M  file", " D other", " M sub/inside", "?? new"));
}

INSTANTIATE_TEST_SUITE_P(
    Conversion, EmptiedFilesUnder,
    testing::Values(
        Conversion{"text", "* text\n", {}}, Conversion{"automatic", "* text=auto\n", {}},
        Conversion{"lineFeeds", "* text eol=lf\n", {}},
        Conversion{"lineEnds", "* text eol=crlf\n", {}},
        Conversion{"automaticLineEnds", "* text=auto eol=crlf\n", {}},
        Conversion{"older", "* crlf\n", {}}, Conversion{"ident", "* ident\n", {}},
        Conversion{"configured", "", {{"core.autocrlf", "true"}}},
        Conversion{"configuredInput", "", {{"core.autocrlf", "input"}}},
        Conversion{"configuredEnds", "* text=auto\n", {{"core.eol", "crlf"}}},
        Conversion{"safe", "[fs]* text eol=crlf\n", {{"core.safecrlf", "true"}}},
        Conversion{"warned", "* text=auto\n", {{"core.safecrlf", "warn"}}},
        Conversion{"encoded", "file text working-tree-encoding=UTF-16LE\n", {}, {"1\0\n\0", 4}},
        Conversion{"binary", "* binary\n", {}}),
    [](const auto &test) { return test.param.name; });

} // namespace
