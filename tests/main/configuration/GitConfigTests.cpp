// SPDX-License-Identifier: MIT
#include <filesystem>
#include <optional>
#include <string>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "GitConfigFixture.hpp"
#include "support/Descriptors.hpp"
#include "support/Failure.hpp"
#include "support/LogCapture.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/text.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

using testing::HasSubstr;
using testing::IsEmpty;
using vclink::git::GitConfig;
using namespace vclink::test;

const std::string driverOfOptHost = "\"/opt/host/bin/lnxhost/vkAutoMerge.sh\" %O %A %B %A";
const std::string mergeToolOfOptHost =
    "\"/opt/host/bin/lnxhost/vkMerge\" $PWD/$BASE $PWD/$LOCAL $PWD/$REMOTE $PWD/$MERGED";
const std::string diffToolOfOptHost = "\"/opt/host/bin/lnxhost/vkDiff\" $LOCAL $PWD/$REMOTE";

/// The user's files as they are on a machine, with "/opt/host" as the place of installation.
class GitConfigFile : public GitConfigFixture
{
  protected:
    GitConfigFile() : installation_("/opt/host")
    {
    }

    static std::filesystem::perms permissionsOf(const std::filesystem::path &file)
    {
        return std::filesystem::status(file).permissions();
    }

    const InstallPath installation_;
};

TEST_F(GitConfigFile, ThatIsMissingHasNoValuesAndNoPath)
{
    const GitConfig config;
    EXPECT_EQ(config.readAutoMergeDriver(), std::nullopt);
    EXPECT_EQ(config.readMergeTool(), std::nullopt);
    EXPECT_EQ(config.readDiffTool(), std::nullopt);
    EXPECT_EQ(config.globalFilePath(), std::nullopt);
    EXPECT_FALSE(std::filesystem::exists(global()));
}

TEST_F(GitConfigFile, ThatIsMissingIsMadeByTheFirstWrite)
{
    GitConfig config;
    config.writeMergeTool();
    EXPECT_TRUE(std::filesystem::exists(global()));
    ASSERT_NE(config.globalFilePath(), std::nullopt);
    EXPECT_EQ(asBytes(*config.globalFilePath()), global().string());
    EXPECT_TRUE(config.globalFilePath()->native());
    EXPECT_EQ(shown(config.readMergeTool()), mergeToolOfOptHost);
    EXPECT_EQ(config.readAutoMergeDriver(), std::nullopt);
    EXPECT_EQ(config.readDiffTool(), std::nullopt);
}

TEST_F(GitConfigFile, HoldsTheseLinesAfterAllThreeWritesAndGivesThemBackAsGitDoes)
{
    GitConfig config;
    config.writeAutoMergeDriver();
    config.writeMergeTool();
    config.writeDiffTool();
    // No write repeats an existing line.
    config.writeAutoMergeDriver();
    EXPECT_EQ(read(global()),
              "[merge \"vkAutoMerge\"]\n"
              "\tdriver = \\\"/opt/host/bin/lnxhost/vkAutoMerge.sh\\\" %O %A %B %A\n"
              "[mergetool \"vkMerge\"]\n"
              "\tcmd = \\\"/opt/host/bin/lnxhost/vkMerge\\\" $PWD/$BASE $PWD/$LOCAL $PWD/$REMOTE "
              "$PWD/$MERGED\n"
              "[difftool \"vkDiff\"]\n"
              "\tcmd = \\\"/opt/host/bin/lnxhost/vkDiff\\\" $LOCAL $PWD/$REMOTE\n");
    const GitConfig another;
    const LogCapture log;
    EXPECT_EQ(shown(another.readAutoMergeDriver()), driverOfOptHost);
    EXPECT_EQ(shown(another.readMergeTool()), mergeToolOfOptHost);
    EXPECT_EQ(shown(another.readDiffTool()), diffToolOfOptHost);
    EXPECT_NE(another.globalFilePath(), std::nullopt);
    EXPECT_THAT(log.messages(), IsEmpty());
    EXPECT_EQ(byGit("merge.vkAutoMerge.driver"), driverOfOptHost);
    EXPECT_EQ(byGit("mergetool.vkMerge.cmd"), mergeToolOfOptHost);
    EXPECT_EQ(byGit("difftool.vkDiff.cmd"), diffToolOfOptHost);
}

TEST_F(GitConfigFile, KeepsAnInstallPathOfAnyLetters)
{
    for (const std::string root : {"/opt/my host", "/opt/gr\xC3\xBC\xC3\x9F", "/opt/say \"host\"",
                                   "/opt/back\\slash", "/opt/#1; x", "/opt/caf\xE9"})
    {
        const InstallPath installation(root);
        GitConfig config;
        config.writeDiffTool();
        const std::string expected = '"' + root + "/bin/lnxhost/vkDiff\" $LOCAL $PWD/$REMOTE";
        EXPECT_EQ(shown(config.readDiffTool()), expected);
        EXPECT_EQ(byGit("difftool.vkDiff.cmd"), expected);
    }
}

TEST_F(GitConfigFile, IsLeftAloneWhereAKeyHasSeveralValuesOrAnIncludedOne)
{
    const std::string tool = "[mergetool \"vkMerge\"]\n\tcmd = one\n";
    writeFile(environment().home() / "included", tool);
    for (const std::string &text :
         {tool + "\tcmd = two\n",
          "[include]\n\tpath = " + (environment().home() / "included").string() + '\n'})
    {
        writeFile(global(), text);
        GitConfig config;
        EXPECT_THROW(config.writeMergeTool(), vclink::git::LibGit2Exception);
        EXPECT_EQ(read(global()), text);
    }
    EXPECT_EQ(read(environment().home() / "included"), tool);
}

TEST_F(GitConfigFile, GivesAValueThatGitWrote)
{
    writeFile(global(),
              "[merge \"vkAutoMerge\"]\n\tdriver = \"a \\\"b\\\" \\\\ # no comment\" ; c\n"
              "[mergetool \"vkMerge\"]\n\tcmd = gr\xC3\xBC\xC3\x9F \\\n  more\n"
              "[difftool \"vkDiff\"]\n\tcmd = one\n\tcmd\n");
    const GitConfig config;
    EXPECT_EQ(shown(config.readAutoMergeDriver()), "a \"b\" \\ # no comment");
    EXPECT_EQ(shown(config.readMergeTool()), byGit("mergetool.vkMerge.cmd"));
    EXPECT_EQ(shown(config.readDiffTool()), "") << "the last, a key without a value";
}

TEST_F(GitConfigFile, HasAnExistingValueReplaced)
{
    writeFile(global(), "# mine\n[difftool \"vkDiff\"]\n\tcmd = old \\\"value\\\"\n\tmore = x\n"
                        "[user]\n\tname = Somebody\n");
    GitConfig config;
    config.writeDiffTool();
    EXPECT_EQ(shown(config.readDiffTool()), diffToolOfOptHost);
    EXPECT_EQ(read(global()), "# mine\n[difftool \"vkDiff\"]\n"
                              "\tcmd = \\\"/opt/host/bin/lnxhost/vkDiff\\\" $LOCAL $PWD/$REMOTE\n"
                              "\tmore = x\n[user]\n\tname = Somebody\n");
}

/// libgit2 skips a write of the value that it has read or written before.
TEST_F(GitConfigFile, IsWrittenWhateverTheObjectHasReadBefore)
{
    GitConfig config;
    config.writeDiffTool();
    for (const auto *const now : {"[difftool \"vkDiff\"]\n\tcmd = mine\n", "[user]\n\tname = x\n"})
    {
        writeFile(global(), now);
        config.writeDiffTool();
        EXPECT_EQ(byGit("difftool.vkDiff.cmd"), diffToolOfOptHost) << now;
        EXPECT_EQ(shown(config.readDiffTool()), diffToolOfOptHost) << now;
    }
    std::filesystem::remove(global());
    config.writeDiffTool();
    EXPECT_EQ(byGit("difftool.vkDiff.cmd"), diffToolOfOptHost);
    EXPECT_EQ(shown(config.readDiffTool()), diffToolOfOptHost);
}

/// A repository's and the system's configuration, and a subsection in other letters.
TEST_F(GitConfigFile, OfOthersIsNotSeen)
{
    const auto repository = makeRepository();
    repository.git({"config", "difftool.vkDiff.cmd", "of the repository"});
    writeFile(folder() / "etc/gitconfig", "[difftool \"vkDiff\"]\n\tcmd = of the system\n");
    writeFile(global(), "[difftool \"vkdiff\"]\n\tcmd = other\n");
    EXPECT_EQ(GitConfig().readDiffTool(), std::nullopt);
}

TEST_F(GitConfigFile, OfTheXdgFolderIsTheOneThatIsReadAndWritten)
{
    writeFile(xdg(), "[mergetool \"vkMerge\"]\n\tcmd = of the folder\n");
    GitConfig config;
    EXPECT_EQ(shown(config.readMergeTool()), "of the folder");
    config.writeDiffTool();
    EXPECT_THAT(read(xdg()), HasSubstr("[difftool \"vkDiff\"]"));
    EXPECT_FALSE(std::filesystem::exists(global()));
    EXPECT_EQ(config.globalFilePath(), std::nullopt) << "there is no file in the home folder";
}

TEST_F(GitConfigFile, OfTheXdgFolderGoesBeforeTheOneInTheHomeFolder)
{
    writeFile(xdg(), "[mergetool \"vkMerge\"]\n\tcmd = of the folder\n");
    writeFile(global(), "[mergetool \"vkMerge\"]\n\tcmd = of the home\n"
                        "[difftool \"vkDiff\"]\n\tcmd = of the home\n");
    GitConfig config;
    EXPECT_EQ(shown(config.readMergeTool()), "of the folder");
    EXPECT_EQ(config.readDiffTool(), std::nullopt);
    ASSERT_NE(config.globalFilePath(), std::nullopt);
    EXPECT_EQ(asBytes(*config.globalFilePath()), global().string());
    const std::string before = read(global());
    config.writeDiffTool();
    EXPECT_EQ(read(global()), before);
    EXPECT_THAT(read(xdg()), HasSubstr("vkDiff"));
}

TEST_F(GitConfigFile, MayBeALink)
{
    writeFile(folder() / "real", "[user]\n\tname = Somebody\n");
    std::filesystem::create_symlink(folder() / "real", global());
    GitConfig config;
    config.writeDiffTool();
    EXPECT_EQ(shown(config.readDiffTool()), diffToolOfOptHost);
    EXPECT_EQ(byGit("user.name"), "Somebody");
}

TEST_F(GitConfigFile, KeepsItsModeAsGitDoes)
{
    const std::string text = "[user]\n\tname = Somebody\n";
    const auto byGitItself = folder() / "twin";
    const auto repository = makeRepository();
    for (const unsigned mode : {0600U, 0640U, 0644U, 0664U, 0755U, 0400U})
    {
        const auto permissions = std::filesystem::perms(mode);
        for (const auto &file : {global(), byGitItself})
        {
            writeFile(file, text);
            std::filesystem::permissions(file, permissions);
        }
        repository.git(
            {"config", "--file", byGitItself.string(), "difftool.vkDiff.cmd", diffToolOfOptHost});
        GitConfig config;
        config.writeDiffTool();
        EXPECT_EQ(shown(config.readDiffTool()), diffToolOfOptHost);
        EXPECT_EQ(permissionsOf(global()), permissions);
        EXPECT_EQ(permissionsOf(global()), permissionsOf(byGitItself));
    }
}

TEST_F(GitConfigFile, KeepsItsModeInTheXdgFolderAndBehindALink)
{
    const auto secret = std::filesystem::perms(0600);
    writeFile(folder() / "real", "[user]\n\tname = Somebody\n");
    std::filesystem::permissions(folder() / "real", secret);
    for (const auto &link : {global(), xdg()})
    {
        std::filesystem::create_directories(link.parent_path());
        std::filesystem::create_symlink(folder() / "real", link);
        const NoDescriptorLeak noLeak;
        GitConfig().writeDiffTool();
        EXPECT_EQ(byGit("difftool.vkDiff.cmd"), diffToolOfOptHost);
        EXPECT_EQ(permissionsOf(folder() / "real"), secret);
        EXPECT_TRUE(std::filesystem::is_symlink(link));
        std::filesystem::remove(link);
    }
}

TEST_F(GitConfigFile, ThatIsLockedOrBrokenIsNotWritten)
{
    writeFile(global(), "[user]\n\tname = Somebody\n");
    writeFile(global().string() + ".lock", "");
    GitConfig config;
    EXPECT_EQ(failureOf([&] { config.writeDiffTool(); }).code, GIT_ELOCKED);
    EXPECT_EQ(read(global()), "[user]\n\tname = Somebody\n");
    EXPECT_EQ(config.readDiffTool(), std::nullopt);
    writeFile(global(), "[broken\n");
    EXPECT_EQ(failureOf([] { GitConfig broken; }).errorClass, GIT_ERROR_CONFIG);
    EXPECT_EQ(read(global()), "[broken\n");
}

/// Releases of libgit2 before 1.8 find the old values again from the second look-up on.
TEST_F(GitConfigFile, ThatIsBrokenWhileItIsOpenHasNoValue)
{
    for (const auto read :
         {&GitConfig::readAutoMergeDriver, &GitConfig::readDiffTool, &GitConfig::readMergeTool})
    {
        writeFile(global(), "[difftool \"vkDiff\"]\n\tcmd = mine\n");
        const GitConfig config;
        ASSERT_NE(config.readDiffTool(), std::nullopt);
        writeFile(global(), "[broken\n");
        EXPECT_EQ((config.*read)(), std::nullopt);
    }
}

TEST_F(GitConfigFile, InAFolderThatCannotBeWrittenIsNotWritten)
{
    writeFile(global(), "[user]\n\tname = Somebody\n");
    giveToUnprivilegedUser(environment().home());
    std::filesystem::permissions(environment().home(), std::filesystem::perms(0555));
    const std::string answer = runAsUnprivilegedUser(
        []() -> std::string
        {
            GitConfig config;
            const Failure failure = failureOf([&] { config.writeDiffTool(); });
            return config.readDiffTool() ? "a value" : failure.text;
        });
    std::filesystem::permissions(environment().home(), std::filesystem::perms(0755));
    EXPECT_THAT(answer, HasSubstr("Permission denied"));
    EXPECT_EQ(read(global()), "[user]\n\tname = Somebody\n");
    EXPECT_FALSE(std::filesystem::exists(global().string() + ".lock"));
}

/// libgit2 counts it as missing, and finds no other place then.
TEST_F(GitConfigFile, ThatCannotBeReadMakesTheConstructorRaise)
{
    writeFile(global(), "[difftool \"vkDiff\"]\n\tcmd = mine\n");
    const auto answer = []
    {
        std::string value;
        const auto failure = failureIfAny([&] { value = shown(GitConfig().readDiffTool()); });
        return failure ? "raised " + std::to_string(failure->code) : value;
    };
    EXPECT_EQ(runAsUnprivilegedUser(answer), "mine");
    std::filesystem::permissions(global(), std::filesystem::perms(0));
    EXPECT_EQ(runAsUnprivilegedUser(answer), "raised " + std::to_string(GIT_ENOTFOUND));
}

} // namespace
