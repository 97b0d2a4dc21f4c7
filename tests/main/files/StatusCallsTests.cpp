// SPDX-License-Identifier: MIT
// The calls of libgit2 that a status query makes.
#include <functional>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "error/errorUtil/libgit2Errors.hpp"
#include "main/AdapterFixture.hpp"
#include "main/TestOptionsFactory.hpp"
#include "main/callNames.hpp"
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
using namespace vclink::test;

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

class StatusWalk : public AdapterFixture
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
        return statesBelow(repository_.path(),
                           adapter_->getFolderStates(adapter_->getRootFolder()));
    }

    /// Makes the walk throw in its callback after `count` paths.
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

    GitRepository repository_ = makeRepository();
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
    EXPECT_EQ(calls_.steps(), ofTheQuery);
}

TEST_F(StatusWalk, AsksForTheOptionsFirst)
{
    const auto factory = std::make_shared<TestOptionsFactory>(interactor_);
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

TEST_F(StatusWalk, OpensTheRootItselfWithoutASearchAsTheOtherOperationsDo)
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
    const upath file = asPath(repository_ / "a");
    adapter_->addFiles({file});
    adapter_->markResolved(file);
    adapter_->revertFiles({file});
    // With a query before an addition and before a revert.
    EXPECT_EQ(paths, std::vector<std::string>(7, repository_.path().string()));
}

TEST_F(StatusWalk, GivesTheStatesUpToAFailureOfLibGit2WithoutARecord)
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
        const LogCapture log(0x08 | 0x10);
        EXPECT_EQ(query(), twoStates) << code;
        EXPECT_THAT(log.messages(), ElementsAre());
        EXPECT_EQ(calls_.steps().back(), "git_repository_free");
    }
}

TEST_F(StatusWalk, GivesTheStatesUpToAnExceptionInTheCallbackAndWorksAgain)
{
    raiseAfter(2, [] { throw std::runtime_error("in the callback"); });
    EXPECT_EQ(query(), twoStates);
    EXPECT_EQ(code_, GIT_EUSER);
    EXPECT_NE(pendingCallbackException(), nullptr);
    calls_.answer<git_status_foreach_ext>(nullptr);
    EXPECT_EQ(query(), fourStates);
    EXPECT_NE(pendingCallbackException(), nullptr);
}

TEST_F(StatusWalk, LeavesTheExceptionForTheNextUserErrorOnTheThread)
{
    raiseAfter(0, [] { throw std::runtime_error("in the callback"); });
    EXPECT_EQ(query(), States());
    EXPECT_THAT([] { vclink::git::makeResult(GIT_EUSER).value(); },
                testing::ThrowsMessage<std::runtime_error>("in the callback"));
    EXPECT_EQ(pendingCallbackException(), nullptr);
    EXPECT_THROW(vclink::git::makeResult(GIT_EUSER).value(), LibGit2Exception);
}

TEST_F(StatusWalk, LeavesAnExceptionOfAnyKindFound)
{
    raiseAfter(1, [] { throw 42; });
    EXPECT_EQ(query(), (States{{"a", "Unversioned"}}));
    EXPECT_THAT([] { vclink::git::makeResult(GIT_EUSER).value(); }, testing::Throws<int>(42));
}

#ifdef __clang__
// clang's text of a lambda has only the arguments' types.
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

/// What a walk was asked for.
struct Asked
{
    git_status_options options{};
    std::vector<std::string> pathspec;
    std::string repository;
    bool hasCallback = false;
    bool hasPayload = false;
};

/// The record that the library hands to a status walk.
class StatusRecord : public AdapterFixture
{
  protected:
    StatusRecord()
    {
        calls_.answer<git_status_foreach_ext>(
            [this](auto, git_repository *repository, const git_status_options *options,
                   git_status_cb callback, void *payload)
            {
                const git_strarray &pathspec = options->pathspec;
                walks_.push_back({*options,
                                  {pathspec.strings, pathspec.strings + pathspec.count},
                                  git_repository_workdir(repository),
                                  callback != nullptr,
                                  payload != nullptr});
                return 0;
            });
        adapter_ = makeAdapter(repository_.path());
    }

    GitRepository repository_ = makeRepository();
    LibGit2Recorder calls_;
    std::vector<Asked> walks_;
    std::unique_ptr<vclink::git::GitAdapter> adapter_;
};

TEST_F(StatusRecord, HasTheseFieldsAndHoldsOtherwiseWhatLibGit2Initialises)
{
    git_status_options initialised;
    ASSERT_EQ(git_status_options_init(&initialised, GIT_STATUS_OPTIONS_VERSION), 0);
    adapter_->getFolderStates(adapter_->getRootFolder());
    ASSERT_EQ(walks_.size(), 1U);
    const git_status_options &options = walks_[0].options;
    EXPECT_EQ(options.show, GIT_STATUS_SHOW_INDEX_AND_WORKDIR);
    EXPECT_EQ(options.show, 0);
    EXPECT_EQ(options.flags, 0x95U);
    EXPECT_EQ(options.flags, static_cast<unsigned>(GIT_STATUS_OPT_INCLUDE_UNTRACKED |
                                                   GIT_STATUS_OPT_INCLUDE_UNMODIFIED |
                                                   GIT_STATUS_OPT_RECURSE_UNTRACKED_DIRS |
                                                   GIT_STATUS_OPT_RENAMES_HEAD_TO_INDEX));
    EXPECT_EQ(options.baseline, nullptr);
    EXPECT_TRUE(walks_[0].hasCallback);
    EXPECT_TRUE(walks_[0].hasPayload);
    EXPECT_EQ(options.rename_threshold, initialised.rename_threshold);
    EXPECT_EQ(options.version, 1U);
    EXPECT_EQ(options.version, initialised.version);
    EXPECT_EQ(options.baseline, initialised.baseline);
}

TEST_F(StatusRecord, HasTheWholeListInOneWalk)
{
    adapter_->getFileStates({asPath(repository_ / "z"), asPath(repository_ / "sub/a"),
                             asPath(repository_ / "#b"), asPath(repository_ / "z")});
    ASSERT_EQ(walks_.size(), 1U);
    EXPECT_THAT(walks_[0].pathspec, ElementsAre("z", "sub/a", "[#]b", "z"));
    EXPECT_EQ(walks_[0].options.flags, 0x95U);
}

TEST_F(StatusRecord, HasOnePatternForAFolder)
{
    adapter_->getFolderStates(asPath(repository_ / "sub/dir"));
    adapter_->getFolderStates(adapter_->getRootFolder());
    ASSERT_EQ(walks_.size(), 2U);
    EXPECT_THAT(walks_[0].pathspec, ElementsAre("sub/dir/*"));
    EXPECT_THAT(walks_[1].pathspec, ElementsAre("*"));
    EXPECT_EQ(walks_[0].repository, repository_.path().string() + "/");
}

TEST_F(StatusRecord, IsNotMadeForAnEmptyList)
{
    calls_.clear();
    EXPECT_TRUE(adapter_->getFileStates({}).empty());
    EXPECT_THAT(calls_.steps(), ElementsAre());
}

} // namespace
