// SPDX-License-Identifier: MIT
#include <cstdint>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

#include <fcntl.h>
#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "StagingFixture.hpp"
#include "main/TestOptionsFactory.hpp"
#include "main/callNames.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"
#include "util/path/pathspecEscape.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace
{

using shared_vclink::git::Conflicted;
using testing::ElementsAre;
using testing::IsEmpty;
using vclink::git::TagException;
using namespace vclink::test;
using Names = std::vector<std::string>;

/// The index is read before, to be sure of it, and asked whether case matters.
const Names ofTheReset = ofTheQuery + Names{"git_repository_open_ext"} + ofTheSettings +
                         Names{"git_index_open", "git_repository_set_index", "git_index_set_caps",
                               "git_index_free", "git_revparse_single",      "git_repository_index",
                               "git_index_caps", "git_index_has_conflicts",  "git_reset_default"};
const Names ofTheOptions{"makeCheckoutOptions", "git_checkout_options_init"};
const Names ofTheCheckout{"git_checkout_index"};
const Names ofTheRelease{"git_index_free", "git_object_free", "git_repository_free"};

/// The calls of libgit2 that a revert makes.
class RevertCalls : public StagingFixture
{
  protected:
    RevertCalls()
    {
        repository_.write("file", "edited");
        calls_.clear();
        factory_->onCheckoutOptions = [this] { calls_.note("makeCheckoutOptions"); };
        calls_.on<git_revparse_single>([this](git_object **, git_repository *, const char *text)
                                       { revisions_.emplace_back(text); });
        calls_.on<git_reset_default>(
            [this](git_repository *, const git_object *target, const git_strarray *pathspec)
            {
                targets_.push_back(target == nullptr ? "none" : idOf(target));
                resetFiles_.push_back(textsOf(*pathspec));
            });
        calls_.on<git_checkout_index>(
            [this](git_repository *, git_index *index, const git_checkout_options *options)
            {
                EXPECT_EQ(index, nullptr);
                records_.push_back(*options);
                checkoutFiles_.push_back(textsOf(options->paths));
            });
    }

    static std::string idOf(const git_object *object)
    {
        return git_oid_tostr_s(git_object_id(object));
    }
    static Names textsOf(const git_strarray &pathspec)
    {
        return {pathspec.strings, pathspec.strings + pathspec.count};
    }
    void revert(const Names &names)
    {
        adapter_.revertFiles(files(names));
    }

    std::shared_ptr<TestOptionsFactory> factory_ =
        std::make_shared<TestOptionsFactory>(interactor_);
    vclink::git::GitAdapter adapter_{asPath(repository_.path()), factory_};
    LibGit2Recorder calls_;
    Names revisions_;
    Names targets_;
    std::vector<Names> resetFiles_;
    std::vector<Names> checkoutFiles_;
    std::vector<git_checkout_options> records_;
};

TEST_F(RevertCalls, ResetTheIndexAndCheckItOutWithAChangeOrWithout)
{
    revert({});
    EXPECT_THAT(calls_.steps(), IsEmpty());
    repository_.write("new", "x");
    repository_.add({"new"});
    for (const auto &names : {Names{"file"}, Names{"other"}, Names{"new", "file"}})
    {
        calls_.clear();
        targets_.clear();
        revert(names);
        EXPECT_EQ(calls_.steps(), ofTheReset + ofTheOptions + ofTheCheckout + ofTheRelease);
        EXPECT_THAT(targets_, ElementsAre(repository_.line({"rev-parse", "HEAD"})));
        EXPECT_THAT(calls_.openHandles(), IsEmpty());
    }
    EXPECT_THAT(revisions_, testing::Each("HEAD"));
}

TEST_F(RevertCalls, ResetOnceHoweverTheRootIsWritten)
{
    const std::string root = repository_.path();
    for (const auto *end : {"/", "//", "/.", "/sub/.."})
    {
        targets_.clear();
        repository_.write("file", "edited");
        vclink::git::GitAdapter(asPath(root + end), factory_).revertFiles(files({"file"}));
        EXPECT_THAT(targets_, testing::SizeIs(1)) << end;
    }
}

TEST_F(RevertCalls, ResetASecondTimeWhereAFileIsLostOnTheWay)
{
    repository_.remove("file");
    repository_.symlink("nowhere", "file");
    repository_.add({"file"});
    revert({"file"});
    EXPECT_THAT(targets_, testing::SizeIs(2));
    EXPECT_THAT(resetFiles_, ElementsAre(ElementsAre("file"), ElementsAre("file")));
    EXPECT_THAT(calls_.openHandles(), IsEmpty());
}

/// libgit2 would read HEAD again for the checkout, and could remove the file.
TEST_F(RevertCalls, EndAfterTheResetToNothingIfHeadFailsOnce)
{
    repository_.write("sub/inside", "staged");
    repository_.add({"sub/inside"});
    for (const int code : {GIT_EAUTH, GIT_ENOTFOUND, GIT_EUNBORNBRANCH})
    {
        targets_.clear();
        RepositoryState expected = stateOf(repository_);
        expected.index.erase("file");
        calls_.fail({{"git_revparse_single", code}});
        EXPECT_EQ(failureOf([this] { revert({"file"}); }),
                  (Failure{code, GIT_ERROR_OS, "injected"}));
        EXPECT_THAT(targets_, ElementsAre("none"));
        EXPECT_THAT(checkoutFiles_, IsEmpty());
        EXPECT_EQ(stateOf(repository_), expected);
        EXPECT_THAT(calls_.openHandles(), IsEmpty());
        calls_.fail({});
        revert({"file"});
        EXPECT_EQ(repository_.read("file"), "content of file\n");
        EXPECT_EQ(repository_.git({"status", "--short"}), "M  sub/inside\n");
        repository_.write("file", "edited");
        checkoutFiles_.clear();
    }
}

TEST_F(RevertCalls, EndAfterTheResetToNothingIfItIsUnknownWhetherThereIsACommit)
{
    repository_.git({"checkout", "--quiet", "--orphan", "fresh"});
    calls_.fail({{"git_repository_head", GIT_EAUTH}});
    EXPECT_EQ(failureOf([this] { revert({"file"}); }),
              (Failure{GIT_EAUTH, GIT_ERROR_OS, "injected"}));
    EXPECT_THAT(targets_, ElementsAre("none"));
    EXPECT_THAT(checkoutFiles_, IsEmpty());
    EXPECT_EQ(repository_.read("file"), "edited");
    EXPECT_THAT(calls_.openHandles(), IsEmpty());
}

TEST_F(RevertCalls, ResetToNothingWithoutACommit)
{
    repository_.git({"checkout", "--quiet", "--orphan", "fresh"});
    revert({"file"});
    EXPECT_THAT(targets_, ElementsAre("none"));
    EXPECT_THAT(checkoutFiles_, ElementsAre(ElementsAre("file")));
    EXPECT_EQ(indexOf(repository_).count("file"), 0U);
    EXPECT_EQ(repository_.read("file"), "edited");
    EXPECT_THAT(calls_.openHandles(), IsEmpty());
}

TEST_F(RevertCalls, KeepTheFileIfAnotherProcessMakesTheFirstCommit)
{
    repository_.git({"checkout", "--quiet", "--orphan", "fresh"});
    factory_->onCheckoutOptions = [this] { repository_.git({"update-ref", "HEAD", "main"}); };
    revert({"file"});
    EXPECT_EQ(repository_.read("file"), "edited");
    EXPECT_THAT(calls_.openHandles(), IsEmpty());
}

TEST_F(RevertCalls, HaveTheFilesOfTheListInItsOrder)
{
    repository_.write("#a", "x");
    revert({"sub", "#a", "file", "missing", "file", "."});
    const auto expected =
        ElementsAre("sub", vclink::git::escapePathspec("#a"), "file", "missing", "file", "..");
    EXPECT_THAT(resetFiles_, ElementsAre(expected));
    EXPECT_THAT(checkoutFiles_, ElementsAre(expected));
}

TEST_F(RevertCalls, CheckOutByForceWhateverTheFactorySays)
{
    for (const std::uint64_t strategy :
         {std::uint64_t{0}, std::uint64_t{GIT_CHECKOUT_DRY_RUN},
          std::uint64_t{GIT_CHECKOUT_SAFE | GIT_CHECKOUT_REMOVE_UNTRACKED}, ~std::uint64_t{0}})
    {
        factory_->checkoutOptions.checkoutStrategy = strategy;
        repository_.write("file", "edited");
        revert({"file"});
        EXPECT_EQ(records_.back().checkout_strategy, 6U) << strategy;
        EXPECT_EQ(repository_.read("file"), "content of file\n") << strategy;
    }
}

TEST_F(RevertCalls, CheckOutByForceWithTheAdaptersCallbacksThroughNoLinkOrFifo)
{
    revert({"file"});
    ASSERT_EQ(records_.size(), 1U);
    EXPECT_EQ(records_[0].checkout_strategy,
              static_cast<unsigned>(GIT_CHECKOUT_FORCE | GIT_CHECKOUT_RECREATE_MISSING));
    EXPECT_EQ(records_[0].file_open_flags, O_CREAT | O_TRUNC | O_WRONLY | O_NOFOLLOW | O_NONBLOCK);
    const void *const callbacks = &adapter_.getCallbacks().checkoutCallbacks();
    EXPECT_EQ(records_[0].version, 1U);
    EXPECT_EQ(records_[0].notify_flags, static_cast<unsigned>(GIT_CHECKOUT_NOTIFY_ALL));
    EXPECT_NE(records_[0].progress_cb, nullptr);
    EXPECT_NE(records_[0].perfdata_cb, nullptr);
    EXPECT_EQ(records_[0].perfdata_payload, callbacks);
    EXPECT_EQ(records_[0].baseline, nullptr);
    EXPECT_NE(records_[0].baseline_index, nullptr);
    EXPECT_EQ(records_[0].target_directory, nullptr);
    EXPECT_EQ(records_[0].disable_filters, 0);
}

/// What watches over the checkout is asked after them.
TEST_F(RevertCalls, PassTheNotificationsOnToTheAdaptersCallbacks)
{
    revert({"file"});
    ASSERT_EQ(records_.size(), 1U);
    EXPECT_NE(records_[0].notify_cb, nullptr);
    interactor_->cancel();
    repository_.write("file", "edited");
    EXPECT_THROW(revert({"file"}), vclink::util::exception::CancelledOperationException);
}

TEST_F(RevertCalls, AskTheFactoryOnceAndHoldAShareOfIt)
{
    std::vector<long> shares;
    factory_->onCheckoutOptions = [&] { shares.push_back(factory_.use_count()); };
    revert({"file"});
    // Besides the test's and the adapter's.
    EXPECT_THAT(shares, ElementsAre(3));
    EXPECT_EQ(factory_.use_count(), 2);
}

TEST_F(RevertCalls, PassAnExceptionOfTheFactoryOn)
{
    factory_->onCheckoutOptions = [] { throw std::logic_error("the factory"); };
    EXPECT_THROW(revert({"file"}), std::logic_error);
    EXPECT_THAT(records_, IsEmpty());
    EXPECT_THAT(calls_.openHandles(), IsEmpty());
}

TEST_F(RevertCalls, AreThoseOfTheQueryAloneWhereAFileIsInConflict)
{
    beginMerge({"conflicted"});
    calls_.clear();
    EXPECT_THROW(revert({"file", "conflicted"}), TagException<Conflicted>);
    EXPECT_EQ(calls_.steps(), ofTheQuery);
    EXPECT_THAT(calls_.openHandles(), IsEmpty());
}

TEST_F(RevertCalls, RefuseAConflictOfAnotherProcessAfterTheQuery)
{
    int opened = 0;
    calls_.on<git_repository_open_ext>(
        [&](auto...)
        {
            if (++opened == 2)
                beginMerge({"conflicted"});
        });
    EXPECT_THROW(revert({"file", "conflicted"}), TagException<Conflicted>);
    EXPECT_EQ(opened, 3);
    EXPECT_EQ(repository_.git({"diff", "--name-only", "--diff-filter=U"}), "conflicted\n");
    EXPECT_THAT(repository_.read("conflicted"), testing::HasSubstr("<<<<<<<"));
    EXPECT_THAT(calls_.openHandles(), IsEmpty());
}

TEST_F(RevertCalls, ThatFailAfterTheResetLeaveItInPlace)
{
    repository_.add({"file"});
    const auto expected = stateAfterGit({{"restore", "--staged", "."}});
    for (const auto *name : {"git_checkout_options_init", "git_checkout_index"})
    {
        repository_.add({"file"});
        calls_.fail({{name, GIT_EAUTH}});
        EXPECT_EQ(failureOf([this] { revert({"file"}); }),
                  (Failure{GIT_EAUTH, GIT_ERROR_OS, "injected"}));
        EXPECT_EQ(stateOf(repository_), expected) << name;
    }
}

} // namespace
