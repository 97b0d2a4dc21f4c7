// SPDX-License-Identifier: MIT
#include "error/errorUtil/GitResult.hpp"

#include <string>
#include <type_traits>

#include <boost/exception/get_error_info.hpp>
#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/HermeticLibGit2.hpp"
#include "error/logging/severity.hpp"
#include "error/makeError.hpp"
#include "support/Failure.hpp"
#include "support/LogCapture.hpp"
#include "support/boostRelease.hpp"
#include "support/libgit2Release.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::git
{
namespace
{

using test::Failure;
using test::failureOf;
using test::isError;
using test::LogCapture;
using testing::ElementsAre;
using testing::IsEmpty;

/// Looks into results past their checks, as only a policy can.
struct Peek : boost::outcome_v2::policy::base
{
    template <class Result> static const GitError &error(const Result &result)
    {
        return _error(result);
    }
    /// A result that was never given anything.
    template <class Result> static Result emptied(Result result)
    {
        _set_has_value(result, false);
        _set_has_error(result, false);
        return result;
    }
};

template <class Value> constexpr bool isValueType()
{
    using Result = GitResult<Value>;
    static_assert(
        std::is_same_v<Result, boost::outcome_v2::basic_result<Value, GitError, GitErrorPolicy>>);
    return std::is_same_v<typename Result::value_type, Value> &&
           std::is_same_v<typename Result::error_type, GitError> &&
           std::is_constructible_v<Result, GitError>;
}
static_assert(isValueType<void>() && isValueType<git_oid>() && isValueType<const char *>());
static_assert(isValueType<git_checkout_options>() && isValueType<git_clone_options>() &&
              isValueType<git_fetch_options>() && isValueType<git_merge_options>() &&
              isValueType<git_proxy_options>() && isValueType<git_push_options>() &&
              isValueType<git_remote_callbacks>() && isValueType<git_status_options>());
static_assert(isValueType<OwnedHandle<git_annotated_commit>>() &&
              isValueType<OwnedHandle<git_branch_iterator>>() &&
              isValueType<OwnedHandle<git_commit>>() && isValueType<OwnedHandle<git_config>>() &&
              isValueType<OwnedHandle<git_index>>() &&
              isValueType<OwnedHandle<git_index_conflict_iterator>>() &&
              isValueType<OwnedHandle<git_object>>() && isValueType<OwnedHandle<git_odb>>() &&
              isValueType<OwnedHandle<git_odb_object>>() &&
              isValueType<OwnedHandle<git_reference>>() && isValueType<OwnedHandle<git_remote>>() &&
              isValueType<OwnedHandle<git_repository>>() &&
              isValueType<OwnedHandle<git_signature>>() && isValueType<OwnedHandle<git_tree>>());
static_assert(std::is_empty_v<GitErrorPolicy>);

const std::string valueHook =
    "static constexpr void vclink::git::GitErrorPolicy::wide_value_check(Impl&&)";
const std::string errorHook =
    "static constexpr void vclink::git::GitErrorPolicy::wide_error_check(Impl&&)";

/// Expects that `action` throws a bad_result_access with this text and source position.
template <class Action>
void expectBadAccess(Action action, const std::string &text, const std::string &function, int line)
{
    try
    {
        action();
        ADD_FAILURE() << "nothing was raised";
    }
    catch (const boost::outcome_v2::bad_result_access &access)
    {
        EXPECT_EQ(access.what(), text);
        const auto *const thrownFrom = boost::get_error_info<boost::throw_function>(access);
        const auto *const thrownIn = boost::get_error_info<boost::throw_file>(access);
        const auto *const thrownAt = boost::get_error_info<boost::throw_line>(access);
        ASSERT_TRUE(thrownFrom != nullptr && thrownIn != nullptr && thrownAt != nullptr);
        EXPECT_EQ(*thrownFrom, function);
        EXPECT_STREQ(*thrownIn, "error/errorUtil");
        EXPECT_EQ(*thrownAt, line);
    }
}

class GitResultTest : public testing::Test
{
    const test::HermeticLibGit2 libgit2_{};
};
using GitCheck = GitResultTest;
using GitErrorPolicyTest = GitResultTest;

TEST_F(GitResultTest, GivesTheValueOrTheErrorItHoldsAndWritesNothing)
{
    const LogCapture log;
    const GitResult<const char *> value("value");
    EXPECT_STREQ(value.value(), "value");
    const GitResult<void> failure = makeResult(GIT_ITEROVER);
    EXPECT_TRUE(failure.has_error());
    EXPECT_FALSE(failure.has_value());
    EXPECT_EQ(failure.error().getCode(), GIT_ITEROVER);
    EXPECT_THAT(log.messages(), IsEmpty());
}

TEST_F(GitResultTest, OfASuccessHoldsADefaultMadeError)
{
    git_error_set_str(GIT_ERROR_NET, "stale");
    const GitResult<void> result = makeResult(0);
    ASSERT_TRUE(result.has_value());
    EXPECT_FALSE(result.has_error());
    if (test::boost_release::keepsErrorBesideValue)
    {
        EXPECT_THAT(Peek::error(result), isError(0, 0, u""));
    }
}

int answerWith(int code, const char *text)
{
    if (text != nullptr)
        git_error_set_str(GIT_ERROR_NET, text);
    return code;
}
const char *const none = nullptr;

TEST_F(GitResultTest, OfACallHasItsOwnTextAndNoEarlierOne)
{
    git_error_set_str(GIT_ERROR_CONFIG, "stale");
    EXPECT_TRUE(call(answerWith, 0, none).has_value());
    EXPECT_TRUE(test::libgit2_release::isSilent());
    git_error_set_str(GIT_ERROR_CONFIG, "stale");
    const GitResult<void> silent = call(answerWith, -5, none);
    ASSERT_TRUE(silent.has_error());
    EXPECT_THAT(silent.error(), isError(-5, 0, u""));
    const GitResult<void> told = call(answerWith, -6, "reason");
    ASSERT_TRUE(told.has_error());
    EXPECT_THAT(told.error(), isError(-6, GIT_ERROR_NET, u"reason"));
}

TEST_F(GitResultTest, OfAFailureRaisesItWhenAskedForItsValue)
{
    git_error_set_str(GIT_ERROR_INDEX, "locked");
    const GitResult<void> result = makeResult(GIT_ELOCKED);
    git_error_clear();
    EXPECT_EQ(failureOf([&] { result.value(); }),
              (Failure{GIT_ELOCKED, GIT_ERROR_INDEX, "locked"}));
}

TEST_F(GitCheck, LeavesASuccessAloneAndRaisesAFailureThatIsThereAlreadyOrOfItsCall)
{
    const LogCapture log;
    EXPECT_NO_THROW(check(makeResult(0)));
    EXPECT_THAT(log.messages(), IsEmpty());
    EXPECT_THROW(check(makeResult(GIT_ERROR)), LibGit2Exception);
    EXPECT_NO_THROW(check(answerWith, 0, none));
    EXPECT_EQ(failureOf([] { check(answerWith, GIT_ELOCKED, "locked"); }),
              (Failure{GIT_ELOCKED, GIT_ERROR_NET, "locked"}));
}

TEST_F(GitResultTest, GoesThroughThePolicyAlsoWithAnErrorOfCodeZero)
{
    const LogCapture log(SeverityDiagnostic);
    const GitResult<void> result = GitError();
    EXPECT_NO_THROW(result.value());
    EXPECT_THAT(log.messages(), ElementsAre("Throwing error  (0)"));
}

TEST_F(GitResultTest, TellsThatThereIsNoValueOrNoErrorWhenItHoldsNoneOrNothing)
{
    const LogCapture log;
    const GitResult<void> nothing = Peek::emptied(makeResult(0));
    const GitResult<const char *> value("value");
    expectBadAccess([&] { nothing.value(); }, "no value", valueHook, 52);
    expectBadAccess([&] { static_cast<void>(nothing.error()); }, "no error", errorHook, 60);
    expectBadAccess([&] { static_cast<void>(value.error()); }, "no error", errorHook, 60);
    EXPECT_THAT(log.messages(), IsEmpty());
}

TEST_F(GitErrorPolicyTest, HasHooksThatReturnForWhatTheResultHolds)
{
    const GitResult<const char *> value("value");
    const GitResult<void> failure = makeResult(GIT_ITEROVER);
    EXPECT_NO_THROW(GitErrorPolicy::wide_value_check(value));
    EXPECT_NO_THROW(GitErrorPolicy::wide_error_check(failure));
    EXPECT_THROW(GitErrorPolicy::wide_value_check(failure), LibGit2Exception);
    EXPECT_THROW(GitErrorPolicy::wide_error_check(value), boost::outcome_v2::bad_result_access);
}

} // namespace
} // namespace vclink::git
