// SPDX-License-Identifier: MIT
// Merges through a command in hosts of different kinds, and where it may be configured.
#include <algorithm>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <thread>

#include <gtest/gtest.h>

#include "MergeDriverFixture.hpp"
#include "support/SignalAction.hpp"
#include "support/ThousandDescriptors.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/WorkingFolder.hpp"

namespace
{

namespace fs = std::filesystem;
using vclink::test::NoWorkingFolder;
using vclink::test::Scripts;
using vclink::test::SignalAction;
using vclink::test::ThousandDescriptors;

class MergeDriverHost : public vclink::test::MergeDriverFixture
{
  protected:
    MergeDriverHost()
    {
        makeConflict();
        defineScript("tool", "cat \"$1\" \"$3\" >>\"$2\"");
    }
    void expectMerged() const
    {
        EXPECT_EQ(merge(), 0);
        EXPECT_EQ(staged("file"), "ours\nbase\ntheirs\n");
    }
};

TEST_F(MergeDriverHost, MayIgnoreOrTakeASignalOfABrokenPipe)
{
    for (auto *const handler : {SIG_DFL, SIG_IGN})
    {
        const SignalAction action(SIGPIPE, handler);
        expectMerged();
        repository_.git({"reset", "--quiet", "--hard"});
    }
}

TEST_F(MergeDriverHost, MayHaveAThousandDescriptorsOpen)
{
    const ThousandDescriptors open;
    expectMerged();
}

TEST_F(MergeDriverHost, MayHaveNoWorkingFolderAnyMore)
{
    {
        const NoWorkingFolder nowhere(folder().path());
        EXPECT_EQ(merge(), 0);
    }
    EXPECT_EQ(staged("file"), "ours\nbase\ntheirs\n");
}

TEST_F(MergeDriverHost, MayMergeOnAnyThread)
{
    std::thread([this] { expectMerged(); }).join();
}

TEST_F(MergeDriverHost, SplitsTheNamesOfATemporaryFolderThatHasABlank)
{
    const fs::path temporary = folder() / "a b";
    fs::create_directory(temporary);
    ::setenv("TMPDIR", temporary.c_str(), 1);
    const std::string out = folder() / "arguments";
    const std::string program = scripts_.shell("printf '%s|' \"$@\" >" + out + "; exit 0");
    define("tool", program + " %A");
    EXPECT_EQ(merge(), 0);
    EXPECT_TRUE(fs::is_empty(temporary));
    const std::string split = Scripts::read(out);
    EXPECT_EQ(
        split.compare(0, (folder() / "a").string().size() + 1, (folder() / "a").string() + '|'), 0)
        << split;
    repository_.git({"reset", "--quiet", "--hard"});
    define("tool", program + " \"%A\"");
    EXPECT_EQ(merge(), 0);
    const std::string whole = Scripts::read(out);
    EXPECT_EQ(whole.compare(0, temporary.string().size() + 1, temporary.string() + '/'), 0)
        << whole;
    EXPECT_EQ(std::count(whole.begin(), whole.end(), '|'), 1) << whole;
}

TEST_F(MergeDriverHost, FindsAPlaceholderInTheNameOfTheTemporaryFolder)
{
    const fs::path temporary = folder() / "a%Pb";
    fs::create_directory(temporary);
    ::setenv("TMPDIR", temporary.c_str(), 1);
    const std::string out = folder() / "arguments";
    define("tool", scripts_.shell("printf '%s|' \"$@\" >" + out) + " %A");
    EXPECT_EQ(merge(), 0);
    const std::string beginning = (folder() / "afileb/").string();
    EXPECT_EQ(Scripts::read(out).compare(0, beginning.size(), beginning), 0);
}

TEST_F(MergeDriverHost, RunsTheCommandWithoutFilesWhereNobodyMayWrite)
{
    ::setenv("TMPDIR", "/proc", 1);
    const std::string out = folder() / "found";
    define("tool", scripts_.shell("ls \"$@\" >" + out + "; echo run >>" + out) + " %O %A %B");
    EXPECT_EQ(merge(), 0);
    EXPECT_EQ(Scripts::read(out), "run\n");
    EXPECT_FALSE(isInConflict("file"));
    EXPECT_EQ(staged("file"), "");
}

TEST_F(MergeDriverHost, RunsTheCommandWithoutFilesWhenTheTemporaryFolderIsNotWritable)
{
    const fs::path temporary = folder() / "locked";
    fs::create_directory(temporary);
    ::setenv("TMPDIR", temporary.c_str(), 1);
    const std::string out = environment().home() / "found";
    defineScript("tool", "for f in \"$1\" \"$2\" \"$3\"; do test -e \"$f\" && echo \"$f\" >>" +
                             out + "; done; echo run >>" + out + "; exit 0");
    vclink::test::giveToUnprivilegedUser(folder().path());
    fs::permissions(temporary, fs::perms(0555));
    const std::string answer = vclink::test::runAsUnprivilegedUser(
        [this]() -> std::string
        {
            const int code = merge();
            return code == 0 ? std::string() : "git_merge gave " + std::to_string(code);
        });
    EXPECT_EQ(answer, "");
    EXPECT_EQ(Scripts::read(out), "run\n");
    vclink::test::giveToUnprivilegedUser(folder().path());
    EXPECT_EQ(vclink::test::runAsUnprivilegedUser([this] { return staged("file"); }), "");
    EXPECT_EQ(vclink::test::runAsUnprivilegedUser([this] { return repository_.read("file"); }), "");
}

class MergeDriverConfig : public vclink::test::MergeDriverFixture
{
  protected:
    MergeDriverConfig()
    {
        makeConflict();
    }
    /// A command that merges to a text.
    std::string commandFor(const std::string &text)
    {
        return scripts_.shell("echo " + text + " >\"$1\"") + " %A";
    }
    void defineIn(const fs::path &file, const std::string &command) const
    {
        fs::create_directories(file.parent_path());
        repository_.git({"config", "--file", file.string(), "merge.tool.driver", command});
    }
    std::string merged() const
    {
        EXPECT_EQ(merge(), 0);
        const std::string text = repository_.read("file");
        repository_.git({"reset", "--quiet", "--hard"});
        return text;
    }
};

TEST_F(MergeDriverConfig, MayStandAtAnyLevelTheNearestCounts)
{
    defineIn(folder() / "etc/gitconfig", commandFor("system"));
    EXPECT_EQ(merged(), "system\n");
    defineIn(environment().home() / ".config/git/config", commandFor("xdg"));
    EXPECT_EQ(merged(), "xdg\n");
    defineIn(environment().home() / ".gitconfig", commandFor("global"));
    EXPECT_EQ(merged(), "global\n");
    define("tool", commandFor("repository"));
    EXPECT_EQ(merged(), "repository\n");
}

TEST_F(MergeDriverConfig, MayStandInAnIncludedFile)
{
    defineIn(folder() / "included", commandFor("included"));
    repository_.git({"config", "include.path", folder() / "included"});
    EXPECT_EQ(merged(), "included\n");
}

TEST_F(MergeDriverConfig, CountsWithItsLastValue)
{
    define("tool", commandFor("first"));
    repository_.git({"config", "--add", "merge.tool.driver", commandFor("second")});
    EXPECT_EQ(merged(), "second\n");
}

TEST_F(MergeDriverConfig, IsReadAgainForEveryMerge)
{
    define("tool", commandFor("first"));
    EXPECT_EQ(merged(), "first\n");
    define("tool", commandFor("second"));
    EXPECT_EQ(merged(), "second\n");
}

TEST_F(MergeDriverConfig, IsNotLookedForUnderAnotherSpellingOfTheName)
{
    define("Tool", commandFor("other"));
    EXPECT_NE(merged(), "other\n");
}

} // namespace
