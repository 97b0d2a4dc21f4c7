// SPDX-License-Identifier: MIT
#include <exception>
#include <functional>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "AdapterTest.hpp"
#include "TestOptionsFactory.hpp"
#include "error/errorUtil/GitErrorPolicy.hpp"
#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "error/errorUtil/libgit2Errors.hpp"
#include "options/Callbacks.hpp"
#include "support/LogCapture.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
#include "support/text.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

using testing::Each;
using testing::ElementsAre;
using testing::HasSubstr;
using vclink::git::LibGit2Exception;
using vclink::git::pendingCallbackException;
using vclink::test::asPath;
using vclink::test::LibGit2Recorder;
using vclink::test::LogCapture;
using vclink::test::States;

/// Stands in front of the library's own callback and throws when it has passed some paths on.
class ThrowingCallback
{
  public:
    int status(const char *path, unsigned flags)
    {
        if (left == 0)
            raise();
        --left;
        return callback(path, flags, payload);
    }

    git_status_cb callback = nullptr;
    void *payload = nullptr;
    int left = 0;
    std::function<void()> raise;
};

class StatusWalk : public vclink::test::AdapterTest
{
  protected:
    StatusWalk()
    {
        for (const auto *name : {"a", "b", "c", "d"})
            repository_.write(name, name);
        adapter_ = makeAdapter(repository_.path());
        calls_.clear();
    }
    ~StatusWalk() override
    {
        pendingCallbackException() = nullptr;
    }

    States query()
    {
        return vclink::test::statesBelow(repository_.path(),
                                         adapter_->getFolderStates(adapter_->getRootFolder()));
    }

    /// Lets the walk raise in its callback after `count` paths.
    void raiseAfter(int count, std::function<void()> raise)
    {
        throwing_.left = count;
        throwing_.raise = std::move(raise);
        calls_.answer<git_status_foreach_ext>(
            [this](auto real, git_repository *repository, const git_status_options *options,
                   git_status_cb callback, void *payload)
            {
                throwing_.callback = callback;
                throwing_.payload = payload;
                code_ = real(repository, options,
                             vclink::git::makeCallback<&ThrowingCallback::status, git_status_cb>(),
                             &throwing_);
                return code_;
            });
    }

    vclink::test::GitRepository repository_ = makeRepository();
    std::unique_ptr<vclink::git::GitAdapter> adapter_;
    LibGit2Recorder calls_;
    ThrowingCallback throwing_;
    int code_ = 0;
};

const States twoStates{{"a", "Unversioned"}, {"b", "Unversioned"}};
const States fourStates{
    {"a", "Unversioned"}, {"b", "Unversioned"}, {"c", "Unversioned"}, {"d", "Unversioned"}};

TEST_F(StatusWalk, OpensAfterTheOptionsAndReleasesAtTheEnd)
{
    EXPECT_EQ(query(), fourStates);
    EXPECT_THAT(calls_.steps(), ElementsAre("git_status_options_init", "git_repository_open_ext",
                                            "git_status_foreach_ext", "git_repository_free"));
}

TEST_F(StatusWalk, AsksForTheOptionsFirst)
{
    const auto factory = std::make_shared<vclink::test::TestOptionsFactory>(interactor_);
    factory->onStatusOptions = [this] { calls_.note("makeStatusOptions"); };
    vclink::git::GitAdapter adapter(asPath(folder() / "missing"), factory);
    calls_.clear();
    EXPECT_THROW(adapter.getFolderStates(adapter.getRootFolder()), LibGit2Exception);
    auto first = calls_.steps();
    ASSERT_GE(first.size(), 3U);
    first.resize(3);
    EXPECT_THAT(first, ElementsAre("makeStatusOptions", "git_status_options_init",
                                   "git_repository_open_ext"));
}

TEST_F(StatusWalk, OpensTheRootItselfWithoutASearch)
{
    std::vector<std::string> paths;
    calls_.on<git_repository_open_ext>(
        [&](git_repository **, const char *path, unsigned flags, const char *ceilings)
        {
            paths.emplace_back(path);
            EXPECT_EQ(flags, 1U);
            EXPECT_EQ(flags, static_cast<unsigned>(GIT_REPOSITORY_OPEN_NO_SEARCH));
            EXPECT_EQ(ceilings, nullptr);
        });
    query();
    static_cast<void>(adapter_->getRepository());
    EXPECT_THAT(paths, ElementsAre(repository_.path().string(), repository_.path().string()));
}

TEST_F(StatusWalk, RaisesWhenTheOptionsCannotBeInitialised)
{
    calls_.answer<git_status_options_init>(
        [](auto...)
        {
            git_error_set_str(GIT_ERROR_INVALID, "invalid version 1 on git_status_options");
            return -1;
        });
    try
    {
        query();
        FAIL() << "no exception";
    }
    catch (const LibGit2Exception &exception)
    {
        EXPECT_EQ(exception.getError().getCode(), -1);
        EXPECT_EQ(exception.getError().getMessage(), u"invalid version 1 on git_status_options");
    }
    EXPECT_THAT(calls_.steps(), ElementsAre("git_status_options_init"));
}

TEST_F(StatusWalk, GivesTheStatesUpToAFailureOfLibGit2)
{
    for (const int code : {-1, -3, -7, -31, 1})
    {
        calls_.answer<git_status_foreach_ext>(
            [code](auto, git_repository *, const git_status_options *, git_status_cb callback,
                   void *payload)
            {
                callback("a", GIT_STATUS_WT_NEW, payload);
                callback("b", GIT_STATUS_WT_NEW, payload);
                return code;
            });
        EXPECT_EQ(query(), twoStates) << code;
    }
}

TEST_F(StatusWalk, NeitherLogsNorRaisesAFailure)
{
    calls_.answer<git_status_foreach_ext>([](auto...) { return GIT_ERROR; });
    const LogCapture log(0x08 | 0x10);
    EXPECT_EQ(query(), States());
    EXPECT_THAT(log.messages(), ElementsAre());
}

TEST_F(StatusWalk, ReleasesTheRepositoryAfterAFailure)
{
    calls_.answer<git_status_foreach_ext>([](auto...) { return GIT_ERROR; });
    query();
    EXPECT_EQ(calls_.steps().back(), "git_repository_free");
}

TEST_F(StatusWalk, GivesTheStatesUpToAnExceptionInTheCallback)
{
    raiseAfter(2, [] { throw std::runtime_error("in the callback"); });
    EXPECT_EQ(query(), twoStates);
    EXPECT_EQ(code_, GIT_EUSER);
    EXPECT_NE(pendingCallbackException(), nullptr);
}

TEST_F(StatusWalk, LeavesTheExceptionForTheNextUserErrorOnTheThread)
{
    raiseAfter(0, [] { throw std::runtime_error("in the callback"); });
    EXPECT_EQ(query(), States());
    try
    {
        vclink::git::makeResult(GIT_EUSER).value();
        FAIL() << "no exception";
    }
    catch (const std::runtime_error &error)
    {
        EXPECT_STREQ(error.what(), "in the callback");
    }
    EXPECT_EQ(pendingCallbackException(), nullptr);
    EXPECT_THROW(vclink::git::makeResult(GIT_EUSER).value(), LibGit2Exception);
}

TEST_F(StatusWalk, LeavesAnExceptionOfAnyKindFound)
{
    raiseAfter(1, [] { throw 42; });
    EXPECT_EQ(query(), (States{{"a", "Unversioned"}}));
    try
    {
        vclink::git::makeResult(GIT_EUSER).value();
        FAIL() << "no exception";
    }
    catch (int thrown)
    {
        EXPECT_EQ(thrown, 42);
    }
}

TEST_F(StatusWalk, WorksAgainAfterAnException)
{
    raiseAfter(1, [] { throw std::runtime_error("in the callback"); });
    query();
    calls_.answer<git_status_foreach_ext>(nullptr);
    EXPECT_EQ(query(), fourStates);
    EXPECT_NE(pendingCallbackException(), nullptr);
}

#ifdef __clang__
// clang's text of a lambda tells the arguments' types only.
constexpr const char *traceOfTheCallback = "makeCallbackImpl";
#else
constexpr const char *traceOfTheCallback = "StatusCallbacks::status";
#endif

TEST_F(StatusWalk, TracesEachCallOfTheCallback)
{
    const LogCapture log(0x20);
    query();
    const auto messages = log.messages();
    ASSERT_EQ(messages.size(), 4U);
    EXPECT_THAT(messages, Each(HasSubstr(traceOfTheCallback)));
}

} // namespace
