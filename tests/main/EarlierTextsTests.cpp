// SPDX-License-Identifier: MIT
// libgit2 fails without a text in places, and leaves a text where it goes on from a failure of its
// own: the one is never shown for the other.
#include <functional>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include <git2.h>
#include <gtest/gtest.h>

#include "error/errorUtil/libgit2Errors.hpp"
#include "main/remote/RemoteFixture.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
#include "support/libgit2Release.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/GitAttribute.hpp"
#include "vclink/git/GitAttributes.hpp"
#include "vclink/git/GitConfig.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/GitWorkingCopyGenerator.hpp"

namespace
{

namespace git = vclink::git;
using namespace vclink::test;

/// Functions whose text is never shown: they give no code, the library does not look at it, or they
/// fail with a text of their own only.
const std::set<std::string> functionsWithoutText{"git_checkout_options_init",
                                                 "git_clone_options_init",
                                                 "git_diff_options_init",
                                                 "git_fetch_options_init",
                                                 "git_index_caps",
                                                 "git_index_has_conflicts",
                                                 "git_libgit2_init",
                                                 "git_libgit2_shutdown",
                                                 "git_merge_analysis",
                                                 "git_merge_driver_register",
                                                 "git_merge_driver_unregister",
                                                 "git_merge_options_init",
                                                 "git_oid_cpy",
                                                 "git_oid_fmt",
                                                 "git_pathspec_matches_path",
                                                 "git_proxy_options_init",
                                                 "git_push_options_init",
                                                 "git_remote_init_callbacks",
                                                 "git_status_options_init"};

/// A function that fails without a text, and an operation that it stops.
struct Silence
{
    const char *function;
    std::function<void()> begin;
    std::function<void()> operation;
};

class EarlierTexts : public RemoteFixture
{
  protected:
    EarlierTexts()
    {
        commit("file", "one\n");
        repository_.git({"branch", "topic"});
        repository_.git({"branch", "other"});
        repository_.git({"checkout", "--quiet", "topic"});
        commit("of topic", "x");
        repository_.git({"checkout", "--quiet", "main"});
        commit("of main", "x");
    }

    template <auto Function> Silence silent(const char *name, std::function<void()> operation)
    {
        return {name, [this] { calls_.answer<Function>([](auto...) { return GIT_ERROR; }); },
                std::move(operation)};
    }
    std::vector<Silence> silencesOfFiles();
    std::vector<Silence> silencesOfBranches();
    std::vector<Silence> silencesOfRemotes();

    LibGit2Recorder calls_;
};

std::vector<Silence> EarlierTexts::silencesOfFiles()
{
    const auto revert = [this] { adapter_->revertFiles({pathOf("file")}); };
    const auto commit = [this] { adapter_->commit(upath(), u"message"); };
    return {silent<git_checkout_index>("git_checkout_index", revert),
            silent<git_reset_default>("git_reset_default", revert),
            silent<git_commit_create>("git_commit_create", commit),
            silent<git_index_write_tree>("git_index_write_tree", commit),
            silent<git_index_remove_all>("git_index_remove_all",
                                         [this] { adapter_->removeFiles({pathOf("file")}); }),
            silent<git_index_add_all>("git_index_add_all",
                                      [this] { adapter_->markResolved(pathOf("file")); })};
}

std::vector<Silence> EarlierTexts::silencesOfBranches()
{
    const auto toTopic = [this] { branches().switchBranch("topic"); };
    return {silent<git_repository_set_head>("git_repository_set_head", toTopic),
            silent<git_checkout_tree>("git_checkout_tree", toTopic),
            silent<git_branch_lookup>("git_branch_lookup", toTopic),
            silent<git_branch_create>("git_branch_create",
                                      [this] {
                                          branches().createBranch({"fresh", "main"});
                                      }),
            silent<git_branch_name>("git_branch_name", [this] { branches().getCurrentBranch(); }),
            silent<git_branch_next>("git_branch_next", [this] { branches().getLocalBranches(); }),
            silent<git_revparse_single>("git_revparse_single",
                                        [this] { branches().getRevision("main"); })};
}

std::vector<Silence> EarlierTexts::silencesOfRemotes()
{
    return {silent<git_remote_fetch>("git_remote_fetch", [this] { fetch(); }),
            silent<git_remote_push>("git_remote_push", [this] { push({"refs/heads/main"}); }),
            silent<git_remote_ls>("git_remote_ls", [this] { remote().getRemoteHeads(); }),
            silent<git_remote_connect>("git_remote_connect", [this] { remote().getRemoteHeads(); }),
            silent<git_clone>("git_clone",
                              [this]
                              {
                                  git::GitWorkingCopyGenerator(interactor_)
                                      .generate(asUtf16(nameOf(server_)),
                                                asPath(folder() / "clone"));
                              }),
            silent<git_config_set_string>("git_config_set_string",
                                          [] { git::GitConfig().writeMergeTool(); }),
            silent<git_attr_get>(
                "git_attr_get", [this]
                { git::GitAttributes::create(*adapter_)->getAttribute(asPath("file"), u"text"); }),
            silent<git_repository_open_ext>(
                "git_repository_open_ext",
                [this] { git::GitAdapterFactory().isAdapterFor(asPath(repository_.path())); })};
}

TEST_F(EarlierTexts, AreGoneBeforeEachCallThatCanLeaveOne)
{
    commit("other", "one\n");
    const auto file = pathOf("file");
    repository_.write("new", "new\n");
    repository_.write("file", "two\n");
    calls_.onCall = [this](const std::string &name)
    {
        const bool canLeaveOne =
            calls_.calls().back().givesCode && functionsWithoutText.count(name) == 0;
        EXPECT_TRUE(!canLeaveOne || libgit2_release::isSilent()) << name;
    };
    EXPECT_TRUE(git::GitAdapterFactory().isAdapterFor(asPath(repository_.path())));
    adapter_->getFileStates({file});
    adapter_->addFiles({pathOf("new")});
    adapter_->removeFiles({pathOf("new")});
    adapter_->markResolved(file);
    adapter_->revertFiles({file});
    adapter_->commit(upath(), u"message");
    branches().createBranch({"fresh", "main"});
    branches().switchBranch("topic");
    branches().merge("other");
    branches().switchBranch("main");
    branches().merge("topic");
    branches().getRemoteBranches();
    branches().deleteBranch("fresh");
    git::GitAttributes::create(*adapter_)->getAttribute(asPath("file"), u"text");
    git::GitConfig().writeMergeTool();
    fetch();
    push({"refs/heads/main:refs/heads/pushed"});
    remote().getRemoteHeads();
    git::GitWorkingCopyGenerator(interactor_)
        .generate(asUtf16(nameOf(server_)), asPath(folder() / "clone"));
    calls_.onCall = nullptr;
    EXPECT_GT(calls_.calls().size(), 200U);
}

TEST_F(EarlierTexts, AreNotThoseOfFailures)
{
    for (const auto &silences : {silencesOfFiles(), silencesOfBranches(), silencesOfRemotes()})
    {
        for (const auto &silence : silences)
        {
            silence.begin();
            EXPECT_EQ(failureOf(silence.operation), (Failure{GIT_ERROR, 0, ""}))
                << silence.function;
        }
    }
}

TEST_F(EarlierTexts, AreNotThoseOfAMergeThatFails)
{
    calls_.answer<git_merge>([](auto...) { return GIT_ERROR; });
    try
    {
        branches().merge("topic");
        FAIL() << "no exception";
    }
    catch (const git::GitException &exception)
    {
        EXPECT_EQ(asUtf8(exception.GetUnicodeMessageTxt()).find(earlierText), std::string::npos);
        EXPECT_NE(asUtf8(exception.GetUnicodeMessageTxt()).find(textOf(Failure{GIT_ERROR, 0, ""})),
                  std::string::npos);
    }
}

} // namespace
