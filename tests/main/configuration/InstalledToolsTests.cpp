// SPDX-License-Identifier: MIT
#include <filesystem>
#include <memory>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "GitConfigFixture.hpp"
#include "error/logging/severity.hpp"
#include "main/merge/MergeFixture.hpp"
#include "support/LogCapture.hpp"
#include "support/NothingLeft.hpp"
#include "vclink/git/GitConfig.hpp"
#include "vclink/git/LibGit2Guard.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using namespace vclink::test;

const std::string ancestorText = "1\n2\n3\n4\n5\n6\n7\n8\n9\n";
const std::string ourText = "ours\n2\n3\n4\n5\n6\n7\n8\n9\n";
const std::string theirText = "1\n2\n3\n4\n5\n6\n7\n8\ntheirs\n";
const std::string bothTexts = "ours\n2\n3\n4\n5\n6\n7\n8\ntheirs\n";

/// The host's own launchers, installed below a folder of the test, whose values are written into
/// the user's configuration. The parameter is the folder's name.
class InstalledTools : public MergeFixture, public testing::WithParamInterface<std::string>
{
  protected:
    InstalledTools()
    {
        const auto launchers = root() / "bin/lnxhost";
        std::filesystem::create_directories(launchers);
        for (const auto *name : {"vkAutoMerge.sh", "vkMerge", "vkDiff"})
            std::filesystem::copy_file(std::filesystem::path(VCLINK_LAUNCHER_FOLDER) / name,
                                       launchers / name);
        {
            git::GitConfig config;
            config.writeAutoMergeDriver();
            config.writeMergeTool();
            config.writeDiffTool();
        }
        // The object above has taken the merge driver away when it ended.
        guard_ = std::make_unique<git::LibGit2Guard>();
    }

    std::filesystem::path root() const
    {
        return folder() / GetParam();
    }
    void divergeInLines(const std::string &oursOfFile = ourText,
                        const std::string &theirsOfFile = theirText)
    {
        repository_.commitAll(writes(".gitattributes", "file merge=vkAutoMerge\n"), "attributes");
        diverge(writes("file", oursOfFile), writes("file", theirsOfFile));
    }
    /// Puts a note in the place of the launcher, so that a run of it can be seen.
    void replaceAutoMerge(const std::string &script) const
    {
        const GitRepository launchers(root() / "bin/lnxhost");
        launchers.write("vkAutoMerge.sh", "#!/bin/sh\n" + script);
    }
    bool nothingIsLeft() const
    {
        return std::filesystem::is_empty(environment().temporary());
    }
    /// Expects a run whose "Command: " record begins with the launcher in quotes.
    void expectStarted(const LogCapture &log) const
    {
        const std::string start =
            "Command: \"" + (root() / "bin/lnxhost/vkAutoMerge.sh").string() + "\" ";
        EXPECT_THAT(log.messages(git::SeverityDiagnostic),
                    testing::Contains(testing::StartsWith(start)));
    }

  private:
    const InstallPath installation_{root()};
    std::unique_ptr<git::LibGit2Guard> guard_;
};

TEST_P(InstalledTools, MergeInARealMergeToTheSameAsInGit)
{
    divergeInLines();
    const LogCapture log(git::SeverityDiagnostic);
    const NothingLeft nothingLeft(environment().temporary());
    expectCleanAsGit();
    expectStarted(log);
    EXPECT_THAT(log.messages(), testing::Contains("Auto-merge successful"));
    EXPECT_EQ(repository_.read("file"), bothTexts);
}

/// Not libgit2's own merge of texts, which would come to the same.
TEST_P(InstalledTools, AreWhatDecidesTheResult)
{
    divergeInLines();
    replaceAutoMerge("cat \"$1\" \"$2\" \"$3\" >\"$4.new\" && mv \"$4.new\" \"$4\"\n");
    merge("topic");
    EXPECT_EQ(repository_.read("file"), ancestorText + ourText + theirText);
}

TEST_P(InstalledTools, TakeNoPartAfterAGuardHasEndedUntilTheNextBegins)
{
    divergeInLines();
    replaceAutoMerge("echo tool >\"$4\"\n");
    const std::string head = idOf("HEAD");
    {
        const git::GitConfig withItsGuard;
    }
    merge("topic");
    EXPECT_EQ(repository_.read("file"), bothTexts) << "merged as a text";
    repository_.git({"reset", "--quiet", "--hard", head});
    const git::LibGit2Guard next;
    merge("topic");
    EXPECT_EQ(repository_.read("file"), "tool\n");
}

TEST_P(InstalledTools, LeaveConflictsThatTheyCannotMerge)
{
    divergeInLines("ours\n", "theirs\n");
    const LogCapture log(git::SeverityDiagnostic);
    expectConflicts("topic");
    expectStarted(log);
    EXPECT_THAT(log.messages(), testing::Contains("Auto-merge unsuccessful"));
    EXPECT_THAT(conflicts(), ElementsAre("1 file", "2 file", "3 file"));
    EXPECT_THAT(repository_.read("file"), HasSubstr("<<<<<<< HEAD\nours\n=======\ntheirs\n"));
    EXPECT_TRUE(nothingIsLeft());
}

TEST_P(InstalledTools, ThatAreGoneFailTheMerge)
{
    divergeInLines();
    std::filesystem::remove_all(root());
    EXPECT_THAT(failureOfMerge("topic"), HasSubstr("No such file or directory"));
    EXPECT_TRUE(nothingIsLeft());
}

TEST_P(InstalledTools, ServeGitsMergeTool)
{
    diverge(writes("file", ourText), writes("file", theirText));
    // A conflict that the tool can merge, since only git is told to leave the file alone.
    repository_.write(".git/info/attributes", "file -merge\n");
    EXPECT_FALSE(repository_.tryGit({"merge", "--quiet", "--no-edit", "topic"}).succeeded());
    const auto result = repository_.tryGit(
        {"-c", "mergetool.keepBackup=false", "mergetool", "--no-prompt", "--tool", "vkMerge"});
    EXPECT_TRUE(result.succeeded()) << result.output << result.errors;
    EXPECT_EQ(repository_.read("file"), bothTexts);
    EXPECT_THAT(conflicts(), IsEmpty());
}

TEST_P(InstalledTools, TellGitsMergeToolWhatTheyCannotMerge)
{
    diverge(writes("file", "ours\n"), writes("file", "theirs\n"));
    EXPECT_FALSE(repository_.tryGit({"merge", "--quiet", "--no-edit", "topic"}).succeeded());
    const std::string before = repository_.read("file");
    const auto result = repository_.tryGit({"-c", "mergetool.vkMerge.trustExitCode=true",
                                            "mergetool", "--no-prompt", "--tool", "vkMerge"});
    EXPECT_FALSE(result.succeeded());
    EXPECT_EQ(repository_.read("file"), before);
    EXPECT_THAT(conflicts(), ElementsAre("1 file", "2 file", "3 file"));
}

TEST_P(InstalledTools, ServeGitsDiffTool)
{
    repository_.write("file", ourText);
    const auto result = repository_.tryGit({"difftool", "--no-prompt", "--tool", "vkDiff"});
    EXPECT_TRUE(result.succeeded()) << result.errors;
    EXPECT_THAT(result.output, HasSubstr("\n-1\n+ours\n 2\n"));
    EXPECT_THAT(result.output, HasSubstr("+++ " + repository_.path().string() + "/file"));
}

INSTANTIATE_TEST_SUITE_P(Below, InstalledTools, testing::Values("host", "my host"),
                         [](const auto &test)
                         {
                             return test.param.find(' ') == std::string::npos
                                        ? std::string("APlainFolder")
                                        : std::string("AFolderWithABlank");
                         });

} // namespace
