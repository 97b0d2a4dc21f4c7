// SPDX-License-Identifier: MIT
// The calls of libgit2 that talk to a remote.
#include <csignal>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "RemoteFixture.hpp"
#include "error/errorUtil/libgit2Errors.hpp"
#include "error/logging/severity.hpp"
#include "main/TestOptionsFactory.hpp"
#include "support/LogCapture.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
#include "support/text.hpp"
#include "vclink/git/GitWorkingCopyGenerator.hpp"

namespace
{

namespace git = vclink::git;
using testing::ElementsAre;
using testing::IsEmpty;
using namespace vclink::test;
using Names = std::vector<std::string>;

const Names ofFetch{"git_repository_open_ext",   "git_remote_lookup",
                    "git_fetch_options_init",    "git_proxy_options_init",
                    "git_remote_init_callbacks", "git_remote_fetch",
                    "git_remote_free",           "git_repository_free"};
const Names ofPush{"git_repository_open_ext",   "git_remote_lookup",      "git_push_options_init",
                   "git_remote_init_callbacks", "git_proxy_options_init", "git_remote_push",
                   "git_remote_free",           "git_repository_free"};
const Names ofHeads{"git_repository_open_ext", "git_remote_lookup",  "git_remote_init_callbacks",
                    "git_proxy_options_init",  "git_remote_connect", "git_remote_ls",
                    "git_remote_free",         "git_repository_free"};
const Names ofClone{"git_clone_options_init", "git_checkout_options_init", "git_fetch_options_init",
                    "git_proxy_options_init", "git_remote_init_callbacks", "git_clone",
                    "git_repository_free"};

bool isSigpipeBlocked()
{
    sigset_t mask;
    sigemptyset(&mask);
    pthread_sigmask(SIG_BLOCK, nullptr, &mask);
    return sigismember(&mask, SIGPIPE) == 1;
}

class RemoteCalls : public RemoteFixture
{
  protected:
    struct Operation
    {
        Names names;
        std::function<void()> run;
    };

    /// The four operations with the calls of each, made to succeed.
    std::vector<Operation> operations()
    {
        return {{ofFetch, [this] { fetch(); }},
                {ofPush, [this] { push({"refs/heads/main:refs/heads/pushed"}); }},
                {ofHeads, [this] { remote().getRemoteHeads(); }},
                {ofClone, [this] { clone(); }}};
    }
    void clone()
    {
        const std::string target = (folder() / ("clone " + std::to_string(++clones_))).string();
        generator_.generate(asUtf16(nameOf(server_)), asPath(target));
    }
    const std::string mainId_ = commit("own", "x");
    vclink::git::GitWorkingCopyGenerator generator_{
        std::static_pointer_cast<vclink::ApplicationInteractor>(interactor_)};
    LibGit2Recorder calls_;

  private:
    int clones_ = 0;
};

TEST_F(RemoteCalls, OfEachOperationComeInOrder)
{
    for (const auto &operation : operations())
    {
        calls_.clear();
        operation.run();
        EXPECT_EQ(calls_.steps(), operation.names);
        EXPECT_THAT(calls_.openHandles(), IsEmpty());
    }
}

/// Only a fetch or push that can lose something looks ahead.
TEST_F(RemoteCalls, AreTheSameIfNothingCanBeLost)
{
    repository_.git({"config", "fetch.prune", "true"});
    const Names fetches[] = {{},
                             {"+refs/heads/*:refs/remotes/origin/*", "refs/heads/main"},
                             {"refs/heads/main:refs/remotes/origin/main"},
                             {"refs/tags/*:refs/tags/*"},
                             {"+refs/heads/*:refs/copies/*"}};
    for (const auto &refspecs : fetches)
    {
        calls_.clear();
        fetch(refspecs);
        EXPECT_EQ(calls_.steps(), ofFetch) << testing::PrintToString(refspecs);
    }
    const Names pushes[] = {{},
                            {"refs/heads/main:refs/heads/a", "refs/heads/main:refs/heads/b"},
                            {"+refs/heads/main:refs/own/a", "+refs/heads/main:refs/tags/a"},
                            {":refs/tags/a"}};
    for (const auto &refspecs : pushes)
    {
        calls_.clear();
        push(refspecs);
        EXPECT_EQ(calls_.steps(), ofPush) << testing::PrintToString(refspecs);
    }
}

TEST_F(RemoteCalls, LookAheadOverTheSameConnection)
{
    const auto middle = [this](const std::function<void()> &operation)
    {
        calls_.clear();
        operation();
        const Names steps = calls_.steps();
        return Names(steps.begin() + 5, steps.end() - 2);
    };
    repository_.git({"tag", "own"});
    EXPECT_THAT(middle([this] { push({"refs/tags/own"}); }),
                ElementsAre("git_revparse_single", "git_object_free", "git_remote_connect",
                            "git_remote_ls", "git_remote_push"));
    repository_.git({"config", "remote.origin.tagOpt", "--tags"});
    EXPECT_THAT(middle([this] { fetch(); }),
                ElementsAre("git_remote_connect", "git_remote_ls", "git_reference_name_to_id",
                            "git_remote_fetch"));
    repository_.git({"config", "remote.origin.tagOpt", "--no-tags"});
    repository_.git({"branch", "copy", "origin/main"});
    const std::string id = publish("file", "changed\n");
    EXPECT_THAT(middle([&] { fetch({id + ":refs/heads/copy"}); }),
                ElementsAre("git_remote_prune_refs", "git_remote_connect", "git_remote_ls",
                            "git_reference_name_to_id", "git_remote_download",
                            "git_reference_name_to_id", "git_commit_lookup", "git_commit_free",
                            "git_remote_fetch"));
    EXPECT_THAT(calls_.openHandles(), IsEmpty());
}

TEST_F(RemoteCalls, AreKeptFromTheSignalOfABrokenConnection)
{
    Names unguarded;
    calls_.onCall = [&](const std::string &name)
    {
        if (!isSigpipeBlocked())
            unguarded.push_back(name);
    };
    for (const auto &operation : operations())
    {
        operation.run();
        EXPECT_FALSE(isSigpipeBlocked());
        calls_.fail({{"git_proxy_options_init", -1}});
        failureOf(operation.run);
        EXPECT_FALSE(isSigpipeBlocked());
        calls_.fail({});
    }
    // Those of a clone that make its record, and the reading of an error, touch no connection.
    for (const auto &name : unguarded)
        EXPECT_THAT(name, testing::AnyOf(testing::HasSubstr("_init"), "git_error_last"));
}

TEST_F(RemoteCalls, TakeTheNameAndTheRefspecsAsUtf8)
{
    std::vector<Names> refspecs;
    const auto note = [&](const git_strarray *list)
    {
        ASSERT_NE(list, nullptr);
        refspecs.emplace_back(list->strings, list->strings + list->count);
    };
    calls_.on<git_remote_fetch>(
        [&](git_remote *, const git_strarray *list, const git_fetch_options *, const char *message)
        {
            note(list);
            EXPECT_EQ(message, nullptr);
        });
    calls_.on<git_remote_push>([&](git_remote *, const git_strarray *list, const git_push_options *)
                               { note(list); });
    calls_.on<git_remote_lookup>([](git_remote **, git_repository *, const char *name)
                                 { EXPECT_STREQ(name, "origin"); });
    const Names two{"refs/heads/gr\xC3\xBC\xC3\x9F:refs/own/\xE6\x9D\xB1", " odd caf\xE9 #\\*"};
    calls_.fail({{"git_remote_fetch", -31}, {"git_remote_push", -31}});
    failureOf([&] { fetch(two); });
    failureOf([&] { push(two); });
    failureOf([&] { fetch(); });
    EXPECT_THAT(refspecs, ElementsAre(two, two, Names()));
}

TEST_F(RemoteCalls, CarryTheSetsOfTheAdapter)
{
    void *const set = &adapter_->getCallbacks().remoteCallbacks();
    calls_.on<git_remote_fetch>(
        [&](git_remote *, const git_strarray *, const git_fetch_options *options, const char *)
        {
            EXPECT_EQ(options->callbacks.payload, set);
            EXPECT_EQ(options->proxy_opts.type, GIT_PROXY_NONE);
        });
    calls_.on<git_remote_push>(
        [&](git_remote *, const git_strarray *, const git_push_options *options)
        {
            EXPECT_EQ(options->callbacks.payload, set);
            EXPECT_EQ(options->pb_parallelism, 1U);
        });
    calls_.on<git_remote_connect>(
        [&](git_remote *, git_direction direction, const git_remote_callbacks *callbacks,
            const git_proxy_options *proxy, const git_strarray *headers)
        {
            EXPECT_EQ(direction, GIT_DIRECTION_FETCH);
            EXPECT_EQ(callbacks->payload, set);
            EXPECT_EQ(proxy->type, GIT_PROXY_NONE);
            EXPECT_EQ(headers, nullptr);
        });
    for (const auto &operation : operations())
        operation.run();
}

TEST_F(RemoteCalls, OfACloneAreGivenTheTextsAndASafeRecord)
{
    const std::string target = (folder() / "gr\xC3\xBC\xC3\x9F").string();
    calls_.on<git_clone>(
        [&](git_repository **, const char *url, const char *path, const git_clone_options *options)
        {
            EXPECT_EQ(url, nameOf(server_));
            EXPECT_EQ(path, target);
            EXPECT_EQ(options->bare, 0);
            EXPECT_EQ(options->checkout_branch, nullptr);
            EXPECT_EQ(options->local, GIT_CLONE_LOCAL_AUTO);
            EXPECT_EQ(options->checkout_opts.checkout_strategy, unsigned{GIT_CHECKOUT_SAFE});
        });
    generator_.generate(asUtf16(nameOf(server_)), asPath(target));
}

/// The error is read before the release, which may replace libgit2's record of it.
TEST_F(RemoteCalls, OfACloneComeAfterItsRecordItsTextsAndItsOptions)
{
    const LogCapture log(git::SeverityParameter);
    Names toldAtTheOptions;
    auto factory = std::make_unique<TestOptionsFactory>(interactor_);
    factory->onCloneOptions = [&]
    {
        toldAtTheOptions = log.messages();
        calls_.note("makeCloneOptions");
    };
    const unsigned strategy = GIT_CHECKOUT_FORCE | GIT_CHECKOUT_ALLOW_CONFLICTS;
    factory->cloneOptions.checkoutOptions.checkoutStrategy = strategy;
    git::GitWorkingCopyGenerator generator(std::move(factory));
    calls_.on<git_clone>(
        [&](git_repository **, const char *, const char *, const git_clone_options *options)
        { EXPECT_EQ(options->checkout_opts.checkout_strategy, strategy); });
    calls_.clear();
    const std::string target = folder() / "ordered";
    generator.generate(asUtf16(nameOf(server_)), asPath(target));
    Names expected{"makeCloneOptions"};
    expected.insert(expected.end(), ofClone.begin(), ofClone.end());
    EXPECT_EQ(calls_.steps(), expected);
    EXPECT_THAT(toldAtTheOptions, ElementsAre(" repositorySpecifier=" + nameOf(server_) +
                                              " sandboxRoot.string()=" + target));
    // A text that libgit2 can't take is told of, and refused before the options are asked for.
    toldAtTheOptions.clear();
    EXPECT_EQ(
        failureOf([&] { generator.generate(ustring(u"a\0b", 3), asPath(folder() / "refused")); })
            .code,
        GIT_EINVALIDSPEC);
    EXPECT_THAT(toldAtTheOptions, IsEmpty());
    EXPECT_EQ(log.messages().back().compare(0, 21, " repositorySpecifier="), 0);
}

TEST_F(RemoteCalls, OfACloneThatFailsReleaseWhatItLeft)
{
    calls_.answer<git_clone>(
        [&](auto, git_repository **out, auto...)
        {
            EXPECT_EQ(git_repository_open(out, repository_.path().c_str()), 0);
            git_error_set_str(GIT_ERROR_NET, "of the clone");
            return -9;
        });
    calls_.onCall = [](const std::string &name)
    {
        if (name == "git_repository_free")
            git_error_set_str(GIT_ERROR_OS, "of the release");
    };
    EXPECT_EQ(failureOf([this] { clone(); }), (Failure{-9, GIT_ERROR_NET, "of the clone"}));
    EXPECT_EQ(calls_.steps().back(), "git_repository_free");
}

TEST_F(RemoteCalls, OfAListingAreCopiedWhole)
{
    git_remote_head first = {};
    first.local = 1;
    git_oid_fromstr(&first.oid, "0123456789abcdef0123456789abcdef01234567");
    git_oid_fromstr(&first.loid, "89abcdef0123456789abcdef0123456789abcdef");
    std::string name = "refs/heads/gr\xC3\xBC\xC3\x9F";
    std::string target = "refs/heads/main";
    first.name = name.data();
    first.symref_target = target.data();
    git_remote_head second = {};
    second.local = -2;
    const git_remote_head third = {};
    const git_remote_head *list[] = {&first, &second, &third};
    calls_.answer<git_remote_ls>(
        [&](auto, const git_remote_head ***heads, std::size_t *count, git_remote *)
        {
            *heads = list;
            *count = 3;
            return 0;
        });
    const auto heads = remote().getRemoteHeads();
    name.assign(name.size(), 'x');
    target.assign(target.size(), 'x');
    ASSERT_EQ(heads.size(), 3U);
    // A list that grew would have room for four.
    EXPECT_EQ(heads.capacity(), 3U);
    EXPECT_EQ(heads[0].local, 1);
    EXPECT_THAT(heads[0].oid, testing::ElementsAreArray(first.oid.id));
    EXPECT_THAT(heads[0].loid, testing::ElementsAreArray(first.loid.id));
    EXPECT_EQ(heads[0].name, "refs/heads/gr\xC3\xBC\xC3\x9F");
    EXPECT_EQ(heads[0].symrefTarget, "refs/heads/main");
    EXPECT_EQ(heads[1].local, -2);
    EXPECT_EQ(heads[1].name, "");
    EXPECT_EQ(heads[1].symrefTarget, "");
}

TEST_F(RemoteCalls, AskTheFactoryOfTheAdapterAfterTheLookup)
{
    const auto factory = std::make_shared<TestOptionsFactory>(interactor_);
    factory->onFetchOptions = [this] { calls_.note("makeFetchOptions"); };
    factory->onPushOptions = [this] { calls_.note("makePushOptions"); };
    factory->onProxyOptions = [this] { calls_.note("makeProxyOptions"); };
    factory->pushOptions.packbuilderParallelism = 3;
    git::GitAdapter adapter(asPath(repository_.path()), factory);
    const auto remote = git::GitRemote::create("origin", adapter);
    calls_.on<git_remote_push>(
        [](git_remote *, const git_strarray *, const git_push_options *options)
        { EXPECT_EQ(options->pb_parallelism, 3U); });
    const auto thirdCallOf = [this](const std::function<void()> &operation)
    {
        calls_.clear();
        operation();
        return calls_.steps().at(2);
    };
    EXPECT_EQ(thirdCallOf([&] { remote->fetch({}); }), "makeFetchOptions");
    EXPECT_EQ(thirdCallOf([&] { remote->push({}); }), "makePushOptions");
    EXPECT_EQ(thirdCallOf([&] { remote->getRemoteHeads(); }), "makeProxyOptions");
}

} // namespace
