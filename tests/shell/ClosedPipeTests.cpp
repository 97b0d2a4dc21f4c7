// SPDX-License-Identifier: MIT
#include <csignal>
#include <filesystem>
#include <string>
#include <vector>

#include "ShellMergeFixture.hpp"

namespace vclink::test
{
namespace
{

/// Merges that write to a pipe whose reader has gone, as in "vclink-shell merge other | head".
class ShellClosedPipes : public ShellMergeFixture
{
  protected:
    ShellClosedPipes()
    {
        repository_.write(".gitattributes", "driven merge=looks\n");
        repository_.write("driven", "base\n");
        repository_.commitAll("base");
        makeBranch("other", {{"a", "theirs\n"}, {"new", "theirs\n"}, {"driven", "theirs\n"}});
        commitFiles({{"b", "ours\n"}, {"driven", "ours\n"}});
        // What the command's own children inherit.
        repository_.git({"config", "merge.looks.driver",
                         "cp /proc/self/status " + (folder() / "command").string()});
    }

    /// Merges with the descriptors led to such a pipe.
    CommandResult merge(const std::string &redirections) const
    {
        const std::string script = "exec 9> >(exec true); wait $!; "
                                   "exec \"$0\" --progress always merge other " +
                                   redirections + " 9>&-";
        return Command({"bash", "-c", script, VCLINK_SHELL}).in(repository_.path()).run();
    }
    void expectMerged() const
    {
        EXPECT_EQ(repository_.line({"log", "-1", "--format=%s"}), "Merge branch 'other'");
        EXPECT_EQ(repository_.git({"status", "--porcelain"}), "");
        EXPECT_EQ(repository_.read("new"), "theirs\n");
        EXPECT_FALSE(std::filesystem::exists(repository_ / ".git/index.lock"));
        EXPECT_FALSE(std::filesystem::exists(repository_ / ".git/vclink-merge"));
    }
};

TEST_F(ShellClosedPipes, DoNotEndAMergeInTheMidstOfItsWriting)
{
    const CommandResult result = merge(">&9 2>&9");
    EXPECT_EQ(result.signal, 0);
    EXPECT_EQ(result.exitStatus, 128 + SIGPIPE);
    expectMerged();
}

TEST_F(ShellClosedPipes, OfMessagesChangeNothingElse)
{
    const CommandResult result = merge("2>&9");
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.output, "Merge commit " + head() + ".\n");
    expectMerged();
}

TEST_F(ShellClosedPipes, OfOutputAreNoError)
{
    const CommandResult result = merge(">&9");
    EXPECT_EQ(result.exitStatus, 128 + SIGPIPE);
    EXPECT_EQ(result.errors.find("vclink-shell:"), std::string::npos);
    expectMerged();
}

/// Filters among them rely on it.
TEST_F(ShellClosedPipes, EndTheProgramsThatMergeCommandsAre)
{
    merge("");
    const std::string status = GitRepository(folder().path()).read("command");
    const std::size_t place = status.find("SigIgn:");
    ASSERT_NE(place, std::string::npos);
    const auto ignored = std::stoull(status.substr(place + 7), nullptr, 16);
    EXPECT_EQ(ignored >> (SIGPIPE - 1) & 1U, 0U);
}

} // namespace
} // namespace vclink::test
