// SPDX-License-Identifier: MIT
#include <cstring>
#include <memory>
#include <string>
#include <type_traits>
#include <typeinfo>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/VirtualTable.hpp"
#include "main/GitAttributesImpl.hpp"
#include "main/OtherAdapter.hpp"
#include "main/branches/BranchFixture.hpp"
#include "support/Descriptors.hpp"
#include "support/LogCapture.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAttributes.hpp"

namespace
{

using testing::IsEmpty;
using vclink::git::GitAttributes;
using vclink::git::GitAttributesImpl;
using vclink::git::serialize;
using vclink::test::asPath;
using vclink::test::asUtf16;
using vclink::test::failureOf;
using vclink::test::GitRepository;

class GitAttributesTest : public vclink::test::BranchFixture
{
  protected:
    /// What a new object says, in the words of a line of attributes.
    std::string ask(const std::string &path, const std::string &name) const
    {
        return serialize(
            GitAttributes::create(*adapter_)->getAttribute(asPath(path), asUtf16(name)));
    }
    /// What `git check-attr` says, in the same words.
    std::string byGit(const std::string &path, const std::string &name) const
    {
        const std::string output = repository_.git({"check-attr", "-z", name, "--", path});
        // Path, attribute and information, each with a NUL behind it.
        const std::size_t begin = path.size() + name.size() + 2;
        const std::string information = output.substr(begin, output.find('\0', begin) - begin);
        if (information == "set")
            return name;
        if (information == "unset")
            return '-' + name;
        return information == "unspecified" ? '!' + name : name + '=' + information;
    }
    void expectAsGit(const std::string &path, const std::string &name,
                     const std::string &expected) const
    {
        EXPECT_EQ(ask(path, name), expected) << path << ' ' << name;
        EXPECT_EQ(byGit(path, name), expected) << path << ' ' << name;
    }
};

TEST_F(GitAttributesTest, GivesEachState)
{
    repository_.write(".gitattributes", "*.a text\n*.b -text\n*.c text=auto\n*.d !text\n");
    expectAsGit("x.a", "text", "text");
    expectAsGit("x.b", "text", "-text");
    expectAsGit("x.c", "text", "text=auto");
    expectAsGit("x.d", "text", "!text");
}

TEST_F(GitAttributesTest, GivesTheStatesAsTheirOwnAlternatives)
{
    repository_.write(".gitattributes", "*.a text\n*.b -text\n*.c text=auto\n*.d !text\n");
    const auto attributes = GitAttributes::create(*adapter_);
    const auto index = [&](const std::string &path)
    { return attributes->getAttribute(asPath(path), u"text").attributeValue.index(); };
    EXPECT_EQ(index("x.a"), 0U);
    EXPECT_EQ(index("x.b"), 1U);
    EXPECT_EQ(index("x.c"), 2U);
    EXPECT_EQ(index("x.d"), 3U);
}

TEST_F(GitAttributesTest, IsUnspecifiedWhereNoFileMentionsIt)
{
    expectAsGit("x", "text", "!text");
    repository_.write(".gitattributes", "*.a merge\n");
    expectAsGit("x.a", "text", "!text");
    expectAsGit("x.b", "merge", "!merge");
}

TEST_F(GitAttributesTest, GivesTheNameUnchanged)
{
    repository_.write(".gitattributes", "* text=x\n");
    const auto attributes = GitAttributes::create(*adapter_);
    for (const ustring name : {u"text", u"missing", u"gr\u00FC\u00DF", u"a b"})
        EXPECT_EQ(attributes->getAttribute(asPath("file"), name).name, name);
}

TEST_F(GitAttributesTest, TellsWordsOfStatesFromStates)
{
    repository_.write(".gitattributes",
                      "a x=set\nb x=unset\nc x=true\nd x=false\ne x=unspecified\n");
    EXPECT_EQ(ask("a", "x"), "x=set");
    EXPECT_EQ(ask("b", "x"), "x=unset");
    EXPECT_EQ(ask("c", "x"), "x=true");
    EXPECT_EQ(ask("d", "x"), "x=false");
    EXPECT_EQ(ask("e", "x"), "x=unspecified");
}

/// libgit2 reads it as set, git as an empty value.
TEST_F(GitAttributesTest, TakesAnEmptyValueAsSet)
{
    repository_.write(".gitattributes", "a x=\n");
    EXPECT_EQ(ask("a", "x"), "x");
    EXPECT_EQ(byGit("a", "x"), "x=");
}

TEST_F(GitAttributesTest, TakesTheFileOfTheNearestFolder)
{
    repository_.write(".gitattributes", "*.txt x=root y\n");
    repository_.write("folder/.gitattributes", "*.txt x=folder\n");
    repository_.write("folder/deep/.gitattributes", "*.txt -x\n");
    expectAsGit("a.txt", "x", "x=root");
    expectAsGit("folder/a.txt", "x", "x=folder");
    expectAsGit("folder/deep/a.txt", "x", "-x");
    expectAsGit("folder/deep/a.txt", "y", "y");
    expectAsGit("folder/deep/deeper/a.txt", "x", "-x");
}

TEST_F(GitAttributesTest, TakesPatternsWithFolders)
{
    repository_.write(".gitattributes", "folder/*.txt x\n/top y\n**/any z\n");
    expectAsGit("folder/a.txt", "x", "x");
    expectAsGit("a.txt", "x", "!x");
    expectAsGit("top", "y", "y");
    expectAsGit("folder/top", "y", "!y");
    expectAsGit("folder/deep/any", "z", "z");
}

TEST_F(GitAttributesTest, TakesTheLastLineThatMatches)
{
    repository_.write(".gitattributes", "* x=one\n*.txt x=two\na.* x=three\n*.txt y\n");
    expectAsGit("a.txt", "x", "x=three");
    expectAsGit("b.txt", "x", "x=two");
}

TEST_F(GitAttributesTest, TakesTheFileOfTheRepositoryFirst)
{
    repository_.write(".gitattributes", "* x=tree\n");
    repository_.write(".git/info/attributes", "* x=repository\n");
    expectAsGit("a", "x", "x=repository");
}

TEST_F(GitAttributesTest, TakesTheFileOfTheIndexWhereNoneStands)
{
    repository_.write(".gitattributes", "* x=index\n");
    repository_.write("folder/.gitattributes", "* y=index\n");
    repository_.add();
    repository_.remove(".gitattributes");
    repository_.remove("folder");
    expectAsGit("a", "x", "x=index");
    expectAsGit("folder/a", "y", "y=index");
}

TEST_F(GitAttributesTest, TakesTheWorkingTreesFileBeforeTheIndexs)
{
    repository_.write(".gitattributes", "* x=index\n");
    repository_.add();
    repository_.write(".gitattributes", "* x=tree\n");
    expectAsGit("a", "x", "x=tree");
}

TEST_F(GitAttributesTest, TakesTheUsersFileLast)
{
    GitRepository(environment().home()).write(".config/git/attributes", "* x=user y=user\n");
    repository_.write(".gitattributes", "* x=tree\n");
    expectAsGit("a", "x", "x=tree");
    expectAsGit("a", "y", "y=user");
}

TEST_F(GitAttributesTest, TakesTheFileThatTheConfigurationNames)
{
    GitRepository(folder().path()).write("elsewhere", "* x=configured\n");
    repository_.git({"config", "core.attributesFile", (folder() / "elsewhere").string()});
    expectAsGit("a", "x", "x=configured");
}

TEST_F(GitAttributesTest, ExpandsMacros)
{
    repository_.write(".gitattributes", "[attr]mine x=1 -y z\n*.m mine\n*.bin binary\n");
    expectAsGit("a.m", "mine", "mine");
    expectAsGit("a.m", "x", "x=1");
    expectAsGit("a.m", "y", "-y");
    expectAsGit("a.m", "z", "z");
    expectAsGit("a.bin", "binary", "binary");
    expectAsGit("a.bin", "text", "-text");
    expectAsGit("a.bin", "diff", "-diff");
    expectAsGit("a.bin", "merge", "-merge");
}

TEST_F(GitAttributesTest, LetsALaterLineTakeAMacroBack)
{
    repository_.write(".gitattributes", "*.bin binary\nspecial.bin merge=mine\n");
    expectAsGit("special.bin", "merge", "merge=mine");
    expectAsGit("special.bin", "diff", "-diff");
}

TEST_F(GitAttributesTest, TakesNamesAndValuesThatAreNoAscii)
{
    repository_.write(".gitattributes",
                      "gr\xC3\xBC\xC3\x9F x=sch\xC3\xB6n\nfolder/\xF0\x9F\x8C\xB3 y\n");
    expectAsGit("gr\xC3\xBC\xC3\x9F", "x", "x=sch\xC3\xB6n");
    expectAsGit("folder/\xF0\x9F\x8C\xB3", "y", "y");
}

TEST_F(GitAttributesTest, TakesNamesAndValuesThatAreNoUtf8)
{
    repository_.write(".gitattributes", "caf\xE9 x=th\xE9\n");
    expectAsGit("caf\xE9", "x", "x=th\xE9");
}

TEST_F(GitAttributesTest, TakesAFileThatDoesNotExist)
{
    repository_.write(".gitattributes", "*.txt x\n");
    expectAsGit("no/such/file.txt", "x", "x");
}

TEST_F(GitAttributesTest, CountsARelativePathFromTheRoot)
{
    repository_.write("folder/.gitattributes", "* x\n");
    EXPECT_EQ(ask("folder/a", "x"), "x");
    EXPECT_EQ(ask("a", "x"), "!x");
}

TEST_F(GitAttributesTest, WorksBeforeTheFirstCommitAndInALinkedWorktree)
{
    repository_.write(".gitattributes", "* x\n");
    EXPECT_EQ(ask("a", "x"), "x");
    repository_.commitAll("first");
    const std::string linked = folder() / "linked";
    repository_.git({"worktree", "add", "--quiet", "-b", "second", linked});
    const auto adapter = makeAdapter(linked);
    EXPECT_EQ(serialize(GitAttributes::create(*adapter)->getAttribute(asPath("a"), u"x")), "x");
}

TEST_F(GitAttributesTest, SeesTheFilesAsTheyAreAtEachQuery)
{
    const auto attributes = GitAttributes::create(*adapter_);
    const auto now = [&] { return serialize(attributes->getAttribute(asPath("a"), u"x")); };
    EXPECT_EQ(now(), "!x");
    repository_.write(".gitattributes", "* x\n");
    EXPECT_EQ(now(), "x");
    // The same length, so that nothing but a new reading tells.
    repository_.write(".gitattributes", "* y\n");
    EXPECT_EQ(now(), "!x");
    repository_.remove(".gitattributes");
    EXPECT_EQ(now(), "!x");
}

TEST_F(GitAttributesTest, ChangesNothing)
{
    repository_.write(".gitattributes", "* x\n");
    repository_.commitAll("first");
    const vclink::test::NothingChanges nothing(repository_);
    ask(".gitattributes", "x");
}

TEST_F(GitAttributesTest, FailsWhereTheRepositoryCannotBeOpened)
{
    const auto attributes = GitAttributes::create(*adapter_);
    repository_.remove(".git");
    EXPECT_EQ(failureOf([&] { attributes->getAttribute(asPath("a"), u"x"); }).code, GIT_ENOTFOUND);
    EXPECT_EQ(failureOf([&] { static_cast<void>(GitAttributes::create(*adapter_)); }).code,
              GIT_ENOTFOUND);
}

TEST_F(GitAttributesTest, LogsNothing)
{
    repository_.write(".gitattributes", "* x\n");
    const vclink::test::LogCapture log;
    ask("a", "x");
    EXPECT_THAT(log.messages(), IsEmpty());
}

TEST_F(GitAttributesTest, LeavesNoDescriptorOpen)
{
    repository_.write(".gitattributes", "* x\n");
    ask("a", "x");
    const vclink::test::NoDescriptorLeak noLeak;
    EXPECT_EQ(ask("a", "x"), "x");
}

TEST_F(GitAttributesTest, IsMadeForNoOtherAdapter)
{
    vclink::test::OtherAdapter other;
    EXPECT_THROW(static_cast<void>(GitAttributes::create(other)), std::bad_cast);
}

TEST_F(GitAttributesTest, HasItsOneOperationBehindTheDestructor)
{
    EXPECT_EQ(vclink::test::slotOf(&GitAttributes::getAttribute), 2U);
    EXPECT_TRUE(std::has_virtual_destructor_v<GitAttributes>);
    EXPECT_TRUE(std::is_abstract_v<GitAttributes>);
    EXPECT_FALSE(std::is_copy_constructible_v<GitAttributes>);
    EXPECT_TRUE((std::is_same_v<decltype(GitAttributes::create(*adapter_)),
                                std::unique_ptr<GitAttributes>>));
}

TEST_F(GitAttributesTest, HoldsItsAdapterAndNothingElse)
{
    const GitAttributesImpl attributes(*adapter_);
    ASSERT_EQ(sizeof(attributes), 2 * sizeof(void *));
    const void *words[2];
    std::memcpy(words, static_cast<const void *>(&attributes), sizeof(words));
    EXPECT_EQ(words[1], adapter_.get());
}

} // namespace
