// SPDX-License-Identifier: MIT
// The process's working folder may be deleted while a host runs: no operation on an absolute root
// needs it.
#include <filesystem>
#include <string>

#include <gtest/gtest.h>

#include "main/remote/RemoteFixture.hpp"
#include "support/WorkingFolder.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/GitAttribute.hpp"
#include "vclink/git/GitAttributes.hpp"
#include "vclink/git/GitConfig.hpp"
#include "vclink/git/GitWorkingCopyGenerator.hpp"

namespace
{

namespace fs = std::filesystem;
namespace git = vclink::git;
using namespace vclink::test;

/// Commands of git need a working folder, so what an operation has done is looked at once there is
/// one again.
class DeletedWorkingFolder : public RemoteFixture
{
  protected:
    template <class Action> void withoutFolder(const Action &action) const
    {
        const NoWorkingFolder gone(folder().path());
        action();
    }
};

TEST_F(DeletedWorkingFolder, IsNothingToAProbeAndTheStates)
{
    commit("file", "one\n");
    repository_.write("file", "two\n");
    repository_.write("new", "x");
    withoutFolder(
        [this]
        {
            EXPECT_TRUE(git::GitAdapterFactory().isAdapterFor(asPath(repository_.path())));
            EXPECT_FALSE(git::GitAdapterFactory().isAdapterFor(asPath(folder() / "missing")));
            EXPECT_EQ(adapter_->getFileStates({pathOf("file"), pathOf("new")}).size(), 2U);
            EXPECT_EQ(adapter_->getFolderStates(asPath(repository_.path())).size(), 2U);
            EXPECT_EQ(branches().getRepositoryState(), "Normal");
        });
}

TEST_F(DeletedWorkingFolder, IsNothingToChangesAndTheirCommit)
{
    commit("file", "one\n");
    commit("gone", "one\n");
    repository_.write("file", "two\n");
    repository_.write("new", "x");
    withoutFolder(
        [this]
        {
            adapter_->addFiles({pathOf("new")});
            adapter_->removeFiles({pathOf("gone")});
            adapter_->revertFiles({pathOf("file")});
            adapter_->commit(upath(), u"second");
        });
    EXPECT_EQ(repository_.read("file"), "one\n");
    EXPECT_EQ(repository_.line({"log", "-1", "--format=%s"}), "second");
    EXPECT_EQ(repository_.git({"show", "--format=", "--name-status", "HEAD"}), "D\tgone\nA\tnew\n");
}

TEST_F(DeletedWorkingFolder, IsNothingToBranchesAndMerges)
{
    repository_.write(".gitattributes", "file merge=tool\n");
    repository_.git({"config", "merge.tool.driver", "cp %B %A"});
    commit("file", "base\n");
    repository_.git({"checkout", "--quiet", "-b", "topic"});
    repository_.commitAll("attributes");
    commit("file", "theirs\n");
    repository_.git({"checkout", "--quiet", "main"});
    commit("other", "x");
    withoutFolder(
        [this]
        {
            branches().createBranch(git::BranchParameters("fresh", "main"));
            branches().switchBranch("fresh");
            branches().switchBranch("main");
            branches().deleteBranch("fresh");
            branches().merge("topic");
            EXPECT_EQ(branches().getCurrentBranch().getName(), "main");
        });
    EXPECT_EQ(repository_.read("file"), "theirs\n");
    EXPECT_EQ(repository_.line({"rev-list", "--count", "HEAD", "--merges"}), "1");
}

TEST_F(DeletedWorkingFolder, IsNothingToRemotesAttributesAndTheConfiguration)
{
    commit("file", "one\n");
    publish("other", "x");
    const std::string clone = folder() / "clone";
    withoutFolder(
        [&]
        {
            fetch();
            push({"refs/heads/main:refs/heads/pushed"});
            EXPECT_FALSE(remote().getRemoteHeads().empty());
            git::GitWorkingCopyGenerator(interactor_)
                .generate(asUtf16(nameOf(server_)), asPath(clone));
            git::GitAttributes::create(*adapter_)->getAttribute(asPath("file"), u"text");
            git::GitConfig().writeMergeTool();
        });
    EXPECT_TRUE(fs::exists(fs::path(clone) / ".git"));
    EXPECT_TRUE(server_.tryGit({"rev-parse", "--verify", "pushed"}).succeeded());
}

} // namespace
