// SPDX-License-Identifier: MIT
// What a push refuses as git and its receiving side do, where libgit2 does not.
#include <filesystem>
#include <string>
#include <vector>

#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "RemoteFixture.hpp"

namespace
{

using testing::HasSubstr;
using namespace vclink::test;
using Refspecs = std::vector<std::string>;

class PushObstacles : public RemoteFixture, public testing::WithParamInterface<Naming>
{
  protected:
    PushObstacles() : RemoteFixture(GetParam())
    {
        repository_.git({"fetch", "--quiet", "origin"});
        repository_.git({"reset", "--quiet", "--hard", "origin/main"});
        server_.git({"branch", "side"});
    }

    /// Lets git push from a twin to a copy of the server.
    CommandResult pushWithGit(const GitRepository &there, const Refspecs &refspecs) const
    {
        const auto here = twin();
        here.git({"remote", "set-url", "origin", there.path().string()});
        std::vector<std::string> arguments{"push", "--quiet", "origin"};
        arguments.insert(arguments.end(), refspecs.begin(), refspecs.end());
        return here.tryGit(arguments);
    }

    /// @param words of the text, or empty if git accepts the push
    void expectAsGitDoes(const Refspecs &refspecs, const std::string &words)
    {
        SCOPED_TRACE(testing::PrintToString(refspecs) + ' ' + words);
        const auto there = server_.copyTo(folder() / "twin of the server");
        EXPECT_EQ(pushWithGit(there, refspecs).succeeded(), words.empty());
        if (words.empty())
        {
            push(refspecs);
            EXPECT_EQ(references(server_), references(there));
            return;
        }
        const auto before = references(server_);
        const auto failure = failureOf([&] { push(refspecs); });
        EXPECT_EQ(failure.errorClass, GIT_ERROR_REFERENCE);
        EXPECT_THAT(failure.text, HasSubstr(words));
        EXPECT_EQ(references(server_), before);
    }

    void expectRefusedThoughGitPushes(const std::string &refspec)
    {
        SCOPED_TRACE(refspec);
        EXPECT_TRUE(
            pushWithGit(server_.copyTo(folder() / "twin of the server"), {refspec}).succeeded());
        const auto before = references(server_);
        const auto failure = failureOf([&] { push({refspec}); });
        EXPECT_EQ(failure.errorClass, GIT_ERROR_REFERENCE);
        EXPECT_THAT(failure.text, HasSubstr("would be missing in the remote: use 'git push'"));
        EXPECT_EQ(references(server_), before);
    }

    void tag(const std::string &name, const std::string &object) const
    {
        repository_.git(
            {"-c", "user.name=A", "-c", "user.email=a@b", "tag", "-m", "words", name, object});
    }
};

TEST_P(PushObstacles, GoToTheAddressForPushes)
{
    const std::string fork = folder() / "fork";
    const std::vector<std::string> settings[] = {
        {"remote.origin.pushurl", fork}, {"url." + fork + ".pushInsteadOf", nameOf(server_)}};
    for (const auto &setting : settings)
    {
        const GitRepository there = server_.copyTo(fork);
        publish("file", setting.front());
        commit("file", "of the working copy\n");
        repository_.git({"config", setting.front(), setting.back()});
        const auto before = references(server_);
        push({"refs/heads/main:refs/heads/main", ":refs/heads/side"});
        EXPECT_EQ(references(server_), before);
        EXPECT_EQ(idOf("refs/heads/main", there), idOf("main"));
        EXPECT_FALSE(there.tryGit({"rev-parse", "--verify", "refs/heads/side"}).succeeded());
        repository_.git({"config", "--unset", setting.front()});
        repository_.git({"fetch", "--quiet", "origin"});
        repository_.git({"reset", "--quiet", "--hard", "origin/main"});
    }
}

TEST_P(PushObstacles, KeepTheTagsOfTheRemote)
{
    repository_.git({"tag", "v1"});
    expectAsGitDoes({"refs/tags/v1"}, "");
    expectAsGitDoes({"refs/tags/v1"}, "");
    commit("file", "changed\n");
    repository_.git({"tag", "--force", "v1"});
    const std::string words = "'refs/tags/v1' is another tag at the remote";
    expectAsGitDoes({"refs/tags/v1"}, words);
    expectAsGitDoes({"refs/heads/main:refs/heads/new", "refs/heads/main:refs/tags/v1"}, words);
    EXPECT_EQ(failureOf([this] { push({"refs/tags/v1"}); }).code, GIT_ENONFASTFORWARD);
    repository_.git({"config", "remote.origin.push", "refs/tags/v1"});
    expectAsGitDoes({}, words);
    expectAsGitDoes({"+refs/tags/v1"}, "");
    repository_.git(
        {"-c", "user.name=A", "-c", "user.email=a@b", "tag", "--force", "-m", "words", "v1"});
    expectAsGitDoes({"refs/tags/v1:refs/tags/v1"}, words);
    expectAsGitDoes({":refs/tags/v1", "refs/tags/v1:refs/tags/v2"}, "");
}

TEST_P(PushObstacles, FollowTheSettingsOfARepositoryOnThisMachine)
{
    publish("file", "of the author\n");
    commit("file", "of the working copy\n");
    server_.git({"branch", "old"});
    const std::string main = "refs/heads/main:refs/heads/main";
    const struct
    {
        std::string setting;
        Refspecs refspecs;
        std::string words;
    } cases[] = {
        {"receive.denyDeletes", {":refs/heads/old"}, "receive.denyDeletes is set"},
        {"receive.denyDeletes", {'+' + main}, ""},
        {"receive.denyNonFastForwards", {'+' + main}, "receive.denyNonFastForwards is set"},
        {"receive.denyNonFastForwards", {"+refs/heads/main:refs/heads/side"}, ""},
        {"receive.denyNonFastForwards", {"+refs/heads/main:refs/heads/new"}, ""},
        {"receive.denyNonFastForwards", {":refs/heads/old"}, ""},
        {"receive.none", {":refs/heads/main"}, "current branch"},
        {"receive.none", {'+' + main}, ""}};
    for (const auto &[setting, refspecs, words] : cases)
    {
        const GitRepository kept = server_.copyTo(folder() / "kept");
        server_.git({"config", setting, "true"});
        expectAsGitDoes(refspecs, words);
        kept.copyTo(server_.path());
    }
    const std::string settings = server_.read("config");
    server_.write("config", settings + "[receive]\n\tdenyDeleteCurrent\n");
    expectAsGitDoes({":refs/heads/main"}, "current branch");
    server_.write("config", settings);
    server_.git({"config", "receive.denyDeleteCurrent", "ignore"});
    expectAsGitDoes({":refs/heads/main"}, "");
}

TEST_P(PushObstacles, KeepBranchesThatAreCheckedOutInLinkedTrees)
{
    const std::string linked = folder() / "linked";
    server_.git({"worktree", "add", "--quiet", linked, "side"});
    repository_.git({"branch", "same"});
    commit("file", "of the working copy\n");
    const std::string words = "'refs/heads/side' is checked out";
    const Refspecs move{"refs/heads/main:refs/heads/side"};
    expectAsGitDoes(move, words);
    expectAsGitDoes({":refs/heads/side"}, words);
    expectAsGitDoes({"refs/heads/main:refs/heads/main"}, "");
    expectAsGitDoes({"refs/heads/same:refs/heads/side"}, "");
    server_.git({"symbolic-ref", "refs/heads/alias", "refs/heads/side"});
    GitRepository(linked).git({"symbolic-ref", "HEAD", "refs/heads/alias"});
    expectAsGitDoes(move, words);
    std::filesystem::remove_all(linked);
    expectAsGitDoes(move, words);
    server_.git({"config", "receive.denyCurrentBranch", "ignore"});
    expectAsGitDoes({":refs/heads/side"}, "current branch");
    expectAsGitDoes(move, "");
}

/// libgit2 would write a tree without what is in it, and report success.
TEST_P(PushObstacles, KeepTheRemoteWhole)
{
    repository_.write("folder/file", "only here\n");
    repository_.git({"add", "."});
    const std::string tree = repository_.line({"write-tree"});
    repository_.git({"update-ref", "refs/tags/plain", tree});
    tag("annotated", tree);
    tag("nested", "annotated");
    tag("content", repository_.line({"rev-parse", ":folder/file"}));
    repository_.git({"commit", "--quiet", "-m", "words"});
    tag("commit", "HEAD~");
    for (const auto *const name : {"plain", "annotated", "nested"})
    {
        const std::string reference = std::string("refs/tags/") + name;
        expectRefusedThoughGitPushes(reference);
        expectRefusedThoughGitPushes('+' + reference + ":refs/own/" + name);
        expectRefusedThoughGitPushes(tree + ":refs/own/" + name);
    }
    expectAsGitDoes({"refs/tags/content"}, "");
    expectAsGitDoes({"refs/tags/commit"}, "");
    server_.git(
        {"fetch", "--quiet", repository_.path().string(), "refs/tags/nested:refs/tags/nested"});
    expectAsGitDoes({"refs/tags/nested"}, "");
    EXPECT_THAT(failureOf([this] { push({"refs/tags/none"}); }).text, HasSubstr("src refspec"));
    server_.git({"fsck", "--strict"});
}

INSTANTIATE_TEST_SUITE_P(Locally, PushObstacles,
                         testing::Values(Naming::PlainPath, Naming::FileUrl));

} // namespace
