// SPDX-License-Identifier: MIT
#include <array>
#include <cstring>
#include <memory>
#include <string>
#include <type_traits>
#include <typeinfo>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/VirtualTable.hpp"
#include "main/GitAttributesImpl.hpp"
#include "main/OtherAdapter.hpp"
#include "main/branches/BranchFixture.hpp"
#include "support/LogCapture.hpp"
#include "support/Sentence.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAttributes.hpp"

namespace
{

using testing::IsEmpty;
using vclink::git::GitAttributes;
using vclink::git::GitAttributesImpl;
using vclink::git::serialize;
using namespace vclink::test;

class GitAttributesTest : public BranchFixture
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

/// What one file says of paths: path, attribute and the answer in the words of a line of
/// attributes.
struct AttributeRows : Sentence
{
    std::string text;
    std::vector<std::array<std::string, 3>> answers;
    std::string folder = {};
};

class AttributesOfAFile : public GitAttributesTest,
                          public testing::WithParamInterface<AttributeRows>
{
};

TEST_P(AttributesOfAFile, AreThoseOfGit)
{
    if (!GetParam().folder.empty())
    {
        repository_.write(GetParam().folder + "/.gitattributes", "*.txt x\n* y=folder\n");
        repository_.write(GetParam().folder + "/deep/.gitattributes", "*.txt -x\n");
    }
    repository_.write(".gitattributes", GetParam().text);
    for (const auto &[path, name, expected] : GetParam().answers)
        expectAsGit(path, name, expected);
}

const AttributeRows attributeRows[]{
    {{"InEachState"},
     "*.a text\n*.b -text\n*.c text=auto\n*.d !text\n",
     {{"x.a", "text", "text"},
      {"x.b", "text", "-text"},
      {"x.c", "text", "text=auto"},
      {"x.d", "text", "!text"},
      {"no/such/file.a", "text", "text"},
      {"x.a", "merge", "!merge"},
      {"x", "text", "!text"}}},
    {{"InNoLine"}, "", {{"x", "text", "!text"}}},
    {{"WithFoldersInItsPatterns"},
     "folder/*.txt x\n/top y\n**/any z\n",
     {{"folder/a.txt", "x", "x"},
      {"a.txt", "x", "!x"},
      {"top", "y", "y"},
      {"folder/top", "y", "!y"},
      {"folder/deep/any", "z", "z"}}},
    {{"WithSeveralLinesThatMatch"},
     "* x=one\n*.txt x=two\na.* x=three\n*.txt y\n",
     {{"a.txt", "x", "x=three"}, {"b.txt", "x", "x=two"}}},
    {{"WithMacrosThatALaterLineMayTakeBack"},
     "[attr]mine x=1 -y z\n*.m mine\n*.bin binary\nspecial.bin merge=mine\n",
     {{"a.m", "mine", "mine"},
      {"a.m", "x", "x=1"},
      {"a.m", "y", "-y"},
      {"a.m", "z", "z"},
      {"a.bin", "binary", "binary"},
      {"a.bin", "text", "-text"},
      {"a.bin", "diff", "-diff"},
      {"a.bin", "merge", "-merge"},
      {"special.bin", "merge", "merge=mine"},
      {"special.bin", "diff", "-diff"}}},
    {{"WithNamesAndValuesThatAreNoAsciiOrNoUtf8"},
     "gr\xC3\xBC\xC3\x9F x=sch\xC3\xB6n\nfolder/\xF0\x9F\x8C\xB3 y\ncaf\xE9 x=th\xE9\n",
     {{"gr\xC3\xBC\xC3\x9F", "x", "x=sch\xC3\xB6n"},
      {"folder/\xF0\x9F\x8C\xB3", "y", "y"},
      {"caf\xE9", "x", "x=th\xE9"}}},
    {{"BehindThatOfANearerFolder"},
     "*.txt x=root z\n",
     {{"a.txt", "x", "x=root"},
      {"folder/a.txt", "x", "x"},
      {"folder/a.txt", "z", "z"},
      {"folder/deep/a.txt", "x", "-x"},
      {"folder/deep/deeper/a.txt", "x", "-x"},
      {"folder/deep/a.txt", "y", "y=folder"},
      {"a.txt", "y", "!y"}},
     "folder"},
};

INSTANTIATE_TEST_SUITE_P(Lines, AttributesOfAFile, testing::ValuesIn(attributeRows),
                         testing::PrintToStringParamName());

/// And words that are the names of states are none.
TEST_F(GitAttributesTest, GivesTheStatesAsTheirOwnAlternatives)
{
    repository_.write(".gitattributes", "a x\nb -x\nc x=set\nd !x\ne x=unset\nf x=true\n"
                                        "g x=false\nh x=unspecified\n");
    const std::vector<std::size_t> alternatives{0, 1, 2, 3, 2, 2, 2, 2};
    const std::vector<std::string> words{"x",       "-x",     "x=set",   "!x",
                                         "x=unset", "x=true", "x=false", "x=unspecified"};
    const NothingChanges nothing(repository_);
    const LogCapture log;
    const auto attributes = GitAttributes::create(*adapter_);
    for (std::size_t i = 0; i < words.size(); ++i)
    {
        const auto attribute =
            attributes->getAttribute(asPath(std::string(1, static_cast<char>('a' + i))), u"x");
        EXPECT_EQ(attribute.attributeValue.index(), alternatives[i]) << words[i];
        EXPECT_EQ(serialize(attribute), words[i]);
    }
    EXPECT_THAT(log.messages(), IsEmpty());
}

TEST_F(GitAttributesTest, GivesTheNameUnchanged)
{
    repository_.write(".gitattributes", "* text=x\n");
    const auto attributes = GitAttributes::create(*adapter_);
    for (const ustring name : {u"text", u"missing", u"gr\u00FC\u00DF", u"a b"})
        EXPECT_EQ(attributes->getAttribute(asPath("file"), name).name, name);
}

/// libgit2 reads it as set, git as an empty value.
TEST_F(GitAttributesTest, TakesAnEmptyValueAsSet)
{
    repository_.write(".gitattributes", "a x=\n");
    EXPECT_EQ(ask("a", "x"), "x");
    EXPECT_EQ(byGit("a", "x"), "x=");
}

TEST_F(GitAttributesTest, TakesTheFileOfTheIndexWhereNoneStands)
{
    repository_.write("folder/.gitattributes", "* y=index\n");
    repository_.add();
    repository_.remove("folder");
    expectAsGit("folder/a", "y", "y=index");
}

TEST_F(GitAttributesTest, TakesTheFilesInThisOrder)
{
    GitRepository(environment().home())
        .write(".config/git/attributes", "* a=user b=user c=user d=user\n");
    expectAsGit("x", "d", "d=user");
    repository_.write(".gitattributes", "* a=index b=index c=index\n");
    repository_.add();
    repository_.remove(".gitattributes");
    expectAsGit("x", "c", "c=index");
    repository_.write(".gitattributes", "* a=tree b=tree\n");
    repository_.write(".git/info/attributes", "* a=repository\n");
    expectAsGit("x", "a", "a=repository");
    expectAsGit("x", "b", "b=tree");
    expectAsGit("x", "d", "d=user");
}

TEST_F(GitAttributesTest, TakesTheFileThatTheConfigurationNames)
{
    GitRepository(folder().path()).write("elsewhere", "* x=configured\n");
    repository_.git({"config", "core.attributesFile", (folder() / "elsewhere").string()});
    expectAsGit("a", "x", "x=configured");
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
    // The same length, so that only reading again shows the change.
    repository_.write(".gitattributes", "* y\n");
    EXPECT_EQ(now(), "!x");
    repository_.remove(".gitattributes");
    EXPECT_EQ(now(), "!x");
}

TEST_F(GitAttributesTest, FailsWhereTheRepositoryCannotBeOpened)
{
    const auto attributes = GitAttributes::create(*adapter_);
    repository_.remove(".git");
    EXPECT_EQ(failureOf([&] { attributes->getAttribute(asPath("a"), u"x"); }).code, GIT_ENOTFOUND);
    EXPECT_EQ(failureOf([&] { static_cast<void>(GitAttributes::create(*adapter_)); }).code,
              GIT_ENOTFOUND);
}

TEST_F(GitAttributesTest, IsMadeForGitAdaptersAndHasOneOperationBehindTheDestructor)
{
    OtherAdapter other;
    EXPECT_THROW(static_cast<void>(GitAttributes::create(other)), std::bad_cast);
    EXPECT_EQ(slotOf(&GitAttributes::getAttribute), 2U);
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
