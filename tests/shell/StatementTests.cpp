// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <vector>

#include <gmock/gmock.h>

#include "ShellMergeFixture.hpp"
#include "support/DescriptorLimit.hpp"
#include "support/readFile.hpp"

namespace vclink::test
{
namespace
{

using testing::ElementsAre;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

/// What the documents say of libgit2's differences and of commands in merges.
class ShellStatements : public ShellMergeFixture
{
  protected:
    /// A driver for all files, which writes its words, one a line.
    void useRecorder(const std::string &setting)
    {
        repository_.write("recorder", "#!/bin/sh\nprintf '%s\\n' \"$@\" >\"$WORDS\"\n");
        repository_.setMode("recorder", 0755);
        repository_.write(".gitattributes", "* merge=recorder\n");
        repository_.commitAll("recorder");
        std::string value = setting;
        value.replace(value.find("RECORDER"), 8, (repository_ / "recorder").string());
        repository_.git({"config", "merge.recorder.driver", value});
    }
    /// Has both sides change a file, and merges.
    /// @return what the recorder wrote
    std::vector<std::string> wordsFor(const std::string &name)
    {
        commitFiles({{name, "base\n"}});
        makeBranch("other", {{name, "theirs\n"}});
        commitFiles({{name, "ours\n"}});
        const std::filesystem::path words = folder() / "words";
        shell({"merge", "other"}).in(repository_.path()).environment("WORDS", words.string()).run();
        return split(readFile(words));
    }
};

TEST_F(ShellStatements, ANameWithBlanksBecomesSeveralWordsOfACommand)
{
    useRecorder("RECORDER %P");
    EXPECT_THAT(wordsFor("x --output=F y"), ElementsAre("x", "--output=F", "y"));
}

TEST_F(ShellStatements, QuotesKeepANameTogether)
{
    useRecorder("RECORDER \"%P\"");
    EXPECT_THAT(wordsFor("x --output=F y"), ElementsAre("x --output=F y"));
}

TEST_F(ShellStatements, ANameRunsInAShell)
{
    useRecorder("sh -c \"RECORDER %P\"");
    EXPECT_THAT(wordsFor("$(echo run)"), ElementsAre("run"));
}

TEST_F(ShellStatements, ACommandRunsInTheFolderOfTheUser)
{
    useRecorder("sh -c \"RECORDER $PWD\"");
    EXPECT_THAT(wordsFor("file"), ElementsAre(repository_.path().string()));
}

TEST_F(ShellStatements, KeywordsAreNotExpandedForACommand)
{
    commitFiles({{".gitattributes", "a merge=copies ident\n"}});
    commitFiles({{"a", "$Id$\nbase\n"}});
    makeBranch("other", {{"a", "$Id$\ntheirs\n"}});
    commitFiles({{"a", "$Id$\nours\n"}});
    repository_.git({"config", "merge.copies.driver", "cp %A " + (folder() / "seen").string()});
    EXPECT_THAT(run({"merge", "other"}).output, StartsWith("Merge commit "));
    EXPECT_EQ(readFile(folder() / "seen"), "$Id$\nours\n");
}

TEST_F(ShellStatements, MergeRenormalizeIsNotRead)
{
    repository_.git({"config", "merge.renormalize", "true"});
    commitFiles({{"a", "1\r\n2\r\n"}});
    makeBranch("other", {{"a", "1\r\n2\r\n3\r\n"}});
    repository_.write(".gitattributes", "* text=auto\n");
    repository_.git({"add", "--renormalize", "."});
    repository_.commitAll("normalized");
    const GitRepository twin = makeTwin();
    EXPECT_EQ(twin.tryGit({"merge", "--quiet", "other"}).exitStatus, 0);
    EXPECT_THAT(fail({"merge", "other"}), HasSubstr("in conflict:\n  a\n"));
}

TEST_F(ShellStatements, ACrissCrossHistoryMayMergeADeletionWithAChange)
{
    commitFiles({{"file", "base\n"}});
    repository_.git({"branch", "other"});
    repository_.remove("file");
    repository_.commitAll("ours is gone");
    repository_.git({"checkout", "--quiet", "other"});
    commitFiles({{"file", "theirs\n"}});
    // Each side takes the other in, and keeps its own.
    repository_.tryGit({"merge", "--quiet", "-s", "ours", "-m", "criss", "main"});
    repository_.git({"checkout", "--quiet", "main"});
    repository_.tryGit({"merge", "--quiet", "-s", "ours", "-m", "cross", "other~1"});
    commitFiles({{"b", "ours\n"}});
    const GitRepository twin = makeTwin();
    EXPECT_NE(twin.tryGit({"merge", "--quiet", "other"}).exitStatus, 0);
    EXPECT_THAT(run({"merge", "other"}).output, StartsWith("Merge commit "));
}

TEST_F(ShellStatements, ACloneOfAShallowRepositoryLacksItsListOfWhereHistoryEnds)
{
    commitFiles({{"a", "more\n"}});
    const GitRepository shallow(folder() / "shallow");
    repository_.git(
        {"clone", "--quiet", "--depth=1", "file://" + repository_.path().string(), shallow.path()});
    const CommandResult result = runIn(folder().path(), {"clone", "shallow", "clone"});
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    const GitRepository clone(folder() / "clone");
    EXPECT_TRUE(std::filesystem::exists(shallow / ".git/shallow"));
    EXPECT_FALSE(std::filesystem::exists(clone / ".git/shallow"));
    EXPECT_NE(clone.tryGit({"log"}).exitStatus, 0);
}

/// libgit2 leaves it.
TEST_F(ShellStatements, ACloneThatFailsAtATreeOfThousandsOfLevelsIsRemoved)
{
    std::string deep;
    for (int level = 0; level < 2100; ++level)
        deep += "d/";
    const GitRepository source = makeRepository("deep");
    const CommandResult made = source.command({"fast-import", "--quiet"})
                                   .input("commit refs/heads/main\n"
                                          "committer A <a@example.org> 1 +0000\n"
                                          "data 1\nx\nM 100644 inline " +
                                          deep + "file\ndata 1\ny\n")
                                   .run();
    ASSERT_EQ(made.exitStatus, 0) << made.errors;
    const DescriptorLimit usual(1024);
    const CommandResult result = runIn(folder().path(), {"clone", "deep", "clone"});
    EXPECT_NE(result.exitStatus, 0);
    EXPECT_THAT(result.errors, HasSubstr("File name too long"));
    EXPECT_THAT(result.errors, Not(HasSubstr("unfinished")));
    EXPECT_FALSE(std::filesystem::exists(folder() / "clone"));
}

} // namespace
} // namespace vclink::test
