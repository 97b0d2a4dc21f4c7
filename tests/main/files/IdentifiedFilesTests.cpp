// SPDX-License-Identifier: MIT
// Files with the attribute `ident`, whose ids libgit2 and git do not remove alike.
#include <chrono>
#include <cstddef>
#include <filesystem>
#include <ostream>
#include <string>
#include <utility>
#include <vector>

#include <gtest/gtest.h>

#include "CommitFixture.hpp"

namespace
{

using namespace vclink::test;

const std::string someId = "$Id: 9fc9738c242ca22d04253a285a9031be0d614082 $";

class IdentifiedFiles : public CommitFixture
{
  protected:
    void commitAttributes(const std::string &attributes = "* ident\n")
    {
        repository_.commitAll(writes(".gitattributes", attributes), "attributes");
    }
    /// Has git check the file out again, some time before the index is written.
    void checkOut(const std::string &name) const
    {
        repository_.remove(name);
        repository_.git({"checkout", "--", name});
    }
    /// As a copy of the working copy does.
    void changeTime(const std::string &name) const
    {
        const auto path = repository_ / name;
        std::filesystem::last_write_time(path, std::filesystem::last_write_time(path) -
                                                   std::chrono::hours(1));
    }
    /// Commits, and expects what git makes of the same.
    void expectCommittedAsByGit() const
    {
        const RepositoryState expected = stateAfterGit({{"add", "--update"}});
        commit();
        EXPECT_EQ(indexOf(repository_), expected.index);
        EXPECT_EQ(idOf("HEAD^{tree}") + '\n', repository_.git({"write-tree"}));
        EXPECT_EQ(repository_.git({"fsck", "--strict", "--no-dangling"}), "");
        EXPECT_EQ(repository_.git({"status", "--porcelain", "--untracked-files=no"}), "");
    }
    /// Adds a file or marks it as resolved, and expects what git makes of the same.
    void expectAddedAsByGit(const std::string &name) const
    {
        const RepositoryState expected = stateAfterGit({{"add", "--", name}});
        add({name});
        EXPECT_EQ(stateOf(repository_), expected);
    }
    void expectResolvedAsByGit(const std::string &name) const
    {
        const RepositoryState expected = stateAfterGit({{"add", "--", name}});
        markResolved(name);
        EXPECT_EQ(stateOf(repository_), expected);
    }
};

TEST_F(IdentifiedFiles, ThatNobodyHasEditedAreNotInACommit)
{
    repository_.write("file", "/* $Id$ */\nstatic char id[] = \"$Id$\";\n");
    commitAttributes();
    checkOut("file");
    changeTime("file");
    repository_.write("other", "edited\n");
    const std::string before = idOf("HEAD:file");
    expectCommittedAsByGit();
    EXPECT_EQ(idOf("HEAD:file"), before);
    EXPECT_EQ(repository_.git({"diff", "--name-only", "HEAD~", "HEAD"}), "other\n");
}

/// git writes the files and the index in the same moment: libgit2 compares them by content.
TEST_F(IdentifiedFiles, ThatAreAsOldAsTheIndexAreNotInACommit)
{
    repository_.write("file", "$Id$ $Id$\n");
    commitAttributes();
    checkOut("file");
    std::filesystem::last_write_time(repository_ / ".git/index",
                                     std::filesystem::last_write_time(repository_ / "file"));
    const std::string before = idOf("HEAD:file");
    expectCommittedAsByGit();
    EXPECT_EQ(idOf("HEAD:file"), before);
}

TEST_F(IdentifiedFiles, HaveNoIdsInACommitWithChangedAttributes)
{
    commitAttributes("other ident\n");
    repository_.write(".gitattributes", "file ident\n");
    repository_.write("file", someId + someId + '\n');
    repository_.write("other", someId + someId + '\n');
    expectCommittedAsByGit();
    EXPECT_EQ(committed("file"), "$Id$$Id$\n");
    EXPECT_EQ(committed("other"), someId + someId + '\n');
}

TEST_F(IdentifiedFiles, AreThoseThatGitNames)
{
    for (const auto *attributes : {"* ident=yes\n", "* -ident\n", "", "* ident -text\n",
                                   "[attr]named ident\n* named\n", "* ident\nfile -ident\n"})
    {
        SCOPED_TRACE(attributes);
        repository_.write(".gitattributes", attributes);
        for (const auto *name : {"file", "other", "sub/inside"})
            repository_.write(name, std::string(attributes) + someId + "\r\n" + someId + '\n');
        expectCommittedAsByGit();
    }
    repository_.write(".git/info/attributes", "file ident\n");
    repository_.write("file", someId + someId + '\n');
    expectCommittedAsByGit();
    EXPECT_EQ(committed("file"), "$Id$$Id$\n");
}

TEST_F(IdentifiedFiles, KeepTheirModes)
{
    commitAttributes();
    repository_.write("file", someId + someId + '\n');
    repository_.setMode("file", 0755);
    repository_.remove("other");
    repository_.symlink(someId + someId, "other");
    expectCommittedAsByGit();
    EXPECT_EQ(repository_.git({"ls-tree", "HEAD", "file"}).substr(0, 6), "100755");
}

TEST_F(IdentifiedFiles, MayBeLarge)
{
    commitAttributes();
    std::string text;
    while (text.size() < std::size_t{3} * 1024 * 1024)
        text += std::string(99, 'x') + '\n';
    repository_.write("file", text + someId + "\n$" + text + someId + someId + '\n');
    // Where the library has read a block.
    constexpr std::size_t block = std::size_t{64} * 1024;
    repository_.write("other", std::string(block - 1, 'y') + someId + someId);
    repository_.write("sub/inside", std::string(block - 2, 'y') + someId + someId);
    expectCommittedAsByGit();
    repository_.write("other", std::string(block - 3, 'y') + someId + someId);
    repository_.write("sub/inside", std::string(block, 'y') + someId + someId);
    expectCommittedAsByGit();
}

TEST_F(IdentifiedFiles, AreMarkedAsResolvedWithoutIds)
{
    commitAttributes();
    beginMerge({"file", "other"});
    repository_.write("file", someId + "\n$Idle = $x;\n" + someId + '\n');
    repository_.write("other", "$Id: one\ntwo$ " + someId + someId + '\n');
    expectResolvedAsByGit("file");
    expectCommittedAsByGit();
    EXPECT_EQ(parents().size(), 2U);
    EXPECT_EQ(committed("file"), "$Id$\n$Idle = $x;\n$Id$\n");
}

TEST_F(IdentifiedFiles, InAFolderThatIsMarkedAsResolvedAreStaged)
{
    commitAttributes();
    repository_.write("sub/inside", someId + someId + '\n');
    repository_.write("sub/new", someId + someId + '\n');
    repository_.write("file", someId + someId + '\n');
    expectResolvedAsByGit("sub");
}

/// For libgit2 the edited words are a part of the id.
TEST_F(IdentifiedFiles, AreCommittedWithEditsThatLibGit2DoesNotSee)
{
    repository_.write("file", "$Id$\n");
    repository_.write("other", "$Id$\n");
    commitAttributes();
    repository_.write("file", "$Idea and more$\n");
    repository_.write("other", "$Id: one\ntwo$\n");
    expectResolvedAsByGit("other");
    expectCommittedAsByGit();
    EXPECT_EQ(committed("file"), "$Idea and more$\n");
    EXPECT_EQ(committed("other"), "$Id: one\ntwo$\n");
}

/// libgit2's checkout replaces the first word that begins like an id.
TEST_F(IdentifiedFiles, GetBackWhatACheckoutByLibGit2HasReplaced)
{
    commitAttributes("* ident text\n");
    repository_.write("file", "begin\r\n$Idle = $x;\r\nend\r\n");
    repository_.write("other", "begin\n$Id: a\nb$ $Id$\nend\n");
    repository_.write("sub/inside", "begin\n$Idle = $x;\nend\n");
    repository_.commitAll("words");
    const auto replaced = [this](const std::string &name)
    { return "$Id: " + idOf("HEAD:" + name) + " $"; };
    const std::string unedited = idOf("HEAD:file");
    // The content that it leaves.
    const std::string begin = "begin\n";
    for (const auto *name : {"file", "other", "sub/inside"})
        repository_.remove(name);
    revert({"file", "other", "sub/inside"});
    ASSERT_EQ(repository_.read("file"), begin + replaced("file") + "x;\nend\n");
    ASSERT_EQ(repository_.read("other"), begin + replaced("other") + " $Id$\nend\n");
    ASSERT_EQ(repository_.read("sub/inside"), begin + replaced("sub/inside") + "x;\nend\n");
    changeTime("file");
    repository_.write("other", begin + replaced("other") + " $Id$\nedited\n");
    repository_.write("sub/inside", "edited\n" + begin + replaced("sub/inside") + "x;\nend\n");
    commit();
    EXPECT_EQ(idOf("HEAD:file"), unedited);
    EXPECT_EQ(committed("other"), "begin\n$Id: a\nb$ $Id$\nedited\n");
    EXPECT_EQ(committed("sub/inside"), "edited\nbegin\n$Idle = $x;\nend\n");
    // The id is that of an earlier content now.
    repository_.write("sub/inside", repository_.read("sub/inside") + "more\n");
    commit();
    EXPECT_EQ(committed("sub/inside"), "edited\nbegin\n$Idle = $x;\nend\nmore\n");
}

/// git's checkout has left the word and written the id.
TEST_F(IdentifiedFiles, GetNothingBackIfGitHasCheckedThemOut)
{
    repository_.write("file", "$Idle = $x;\n$Id$\n");
    repository_.write("other", "$Id$\n$Idle = $x;\n");
    commitAttributes();
    checkOut("file");
    checkOut("other");
    repository_.write("file", repository_.read("file") + "edited\n");
    repository_.write("other", repository_.read("other") + "edited\n");
    expectCommittedAsByGit();
    EXPECT_EQ(committed("file"), "$Idle = $x;\n$Id$\nedited\n");
}

TEST_F(IdentifiedFiles, WithUnsafeLineEndsAreRefusedAsBefore)
{
    commitAttributes("* ident text\n");
    repository_.git({"config", "core.safecrlf", "true"});
    repository_.write("file", someId + "\r\n" + someId + '\n');
    const NothingChanges nothing(repository_);
    EXPECT_EQ(failureOf([this] { commit(); }).text, "CRLF would be replaced by LF in 'file'");
}

/// What git makes of a content, with attributes and settings.
struct Content
{
    const char *name;
    std::string bytes;
    std::string attributes = "* ident\n";
    std::vector<std::pair<std::string, std::string>> settings = {};
    std::string before = "before\n";
};

void PrintTo(const Content &content, std::ostream *stream)
{
    *stream << content.name;
}

class IdentifiedContent : public IdentifiedFiles, public testing::WithParamInterface<Content>
{
  protected:
    IdentifiedContent()
    {
        repository_.write("file", GetParam().before);
        commitAttributes(GetParam().attributes);
        for (const auto &[name, value] : GetParam().settings)
            repository_.git({"config", name, value});
    }
};

TEST_P(IdentifiedContent, IsCommittedAsByGit)
{
    repository_.write("file", GetParam().bytes);
    expectCommittedAsByGit();
}

TEST_P(IdentifiedContent, IsAddedAsByGit)
{
    repository_.write("new", GetParam().bytes);
    expectAddedAsByGit("new");
}

TEST_P(IdentifiedContent, IsMarkedAsResolvedAsByGit)
{
    repository_.write("file", GetParam().bytes);
    expectResolvedAsByGit("file");
}

INSTANTIATE_TEST_SUITE_P(
    Of, IdentifiedContent,
    testing::Values(
        Content{"None", "no id\n"}, Content{"One", someId + '\n'},
        Content{"Several", someId + '\n' + someId + ' ' + someId + "\n$Id$" + someId},
        Content{"Foreign", "$Id: x y$ $Id: file,v 1.2 2001/01/01 name Exp $\n$Id:$ $Id:x$\n"},
        Content{"Variables", "$Idle = $x;\n$Id = $y;\n" + someId + "\n$Ids$ $id: a$ $ID: a$\n"},
        Content{"AcrossLines", "$Id: one\ntwo$ " + someId + " $Id: a\r\nb$ $Id: c\rd$\n"},
        Content{"Unfinished", someId + " $Id: $ $Id:"}, Content{"UnfinishedWord", "$Id: a$ $Id"},
        Content{"NextToEachOther", "$Id: a$Id: b$Id: c$$Id: d$$$Id$Id: e$ Id: f$\n"},
        Content{"Binary", std::string("\0\1\2", 3) + someId + someId + '\0'},
        Content{"BinaryWithLineEnds", std::string("\0\r\n", 3) + someId + someId + "\r\n",
                "* ident text=auto\n"},
        Content{"LineEnds", "$Idle = $x;\r\n" + someId + "\r\n" + someId + "\r\n$Jd$\r\n",
                "* ident text\n"},
        Content{"AutomaticLineEnds", "$Idle\r\n" + someId + "\r\n" + someId + "\r\n",
                "* ident text=auto\n"},
        Content{"LineEndsThatAreInTheIndex",
                someId + "\r\n" + someId + "\r\n",
                "* ident text=auto\n",
                {},
                "before\r\n"},
        Content{"LineEndsOfSettings",
                someId + "\r\n" + someId + "\r\n",
                "* ident\n",
                {{"core.autocrlf", "true"}}},
        Content{"LineEndsWrittenOut", someId + "\r\n" + someId + "\r\n", "* ident text eol=crlf\n"},
        Content{"NonPrintableIds", "$Id: \1\2\3\4\5$\r\n" + someId + "\r\n" + someId + "\r\n",
                "* ident text=auto\n"},
        Content{"NoLineEndsConverted", someId + "\r\n" + someId + "\r\n", "* ident -text\n"}),
    [](const auto &test) { return test.param.name; });

} // namespace
