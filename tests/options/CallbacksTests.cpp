// SPDX-License-Identifier: MIT
#include "options/Callbacks.hpp"

#include <climits>
#include <cstddef>
#include <exception>
#include <functional>
#include <stdexcept>
#include <string>
#include <tuple>
#include <type_traits>
#include <utility>
#include <vector>

#include <boost/exception/exception.hpp>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/CoreFilter.hpp"
#include "error/EmptySlot.hpp"
#include "support/LogCapture.hpp"
#include "support/diagnosticText.hpp"
#include "support/isRecord.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::git
{
namespace
{

using test::CoreFilter;
using test::diagnosticTextOf;
using test::isRecord;
using test::LogCapture;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::StartsWith;
using vclink::util::exception::CancelledOperationException;

/// The object that is called through the bridge, and does what a test sets.
class Target
{
  public:
    int answer(const char *text, unsigned number)
    {
        received.emplace_back(text, number);
        return body();
    }
    void notice(const char *text, std::size_t number)
    {
        received.emplace_back(text, static_cast<unsigned>(number));
        body();
    }
    int otherAnswer(unsigned)
    {
        return body();
    }

    std::function<int()> body = [] { return 0; };
    std::vector<std::pair<std::string, unsigned>> received;
};

using AnswerCallback = int (*)(const char *, unsigned, void *);
using NoticeCallback = void (*)(const char *, std::size_t, void *);

constexpr AnswerCallback answerCallback = makeCallback<&Target::answer, AnswerCallback>();
constexpr NoticeCallback noticeCallback = makeCallback<&Target::notice, NoticeCallback>();

using AnswerLambda = decltype(detail::makeCallbackImpl<&Target::answer>(
    std::tuple<const char *, unsigned, void *>()));
using NoticeLambda = decltype(detail::makeCallbackImpl<&Target::notice>(
    std::tuple<const char *, std::size_t, void *>()));
static_assert(std::is_empty_v<AnswerLambda> && std::is_empty_v<NoticeLambda>, "no state");
static_assert(std::is_convertible_v<AnswerLambda, AnswerCallback> &&
              std::is_convertible_v<NoticeLambda, NoticeCallback>);
static_assert(std::is_nothrow_invocable_r_v<int, AnswerLambda, const char *, unsigned, void *>);
static_assert(std::is_nothrow_invocable_v<NoticeLambda, const char *, std::size_t, void *>);
static_assert(
    std::is_void_v<std::invoke_result_t<NoticeLambda, const char *, std::size_t, void *>>);

struct BoostOnly : virtual boost::exception
{
};

class Callback : public testing::Test
{
  protected:
    const test::EmptySlot emptySlot;

    /// Lets the target throw, and gives what the callback answers.
    template <class Exception> int answerThrowing(const Exception &exception)
    {
        target.body = [&exception]() -> int { throw exception; };
        return answerCallback("path", 1, &target);
    }

    Target target;
};

TEST_F(Callback, CallsTheMemberWithItsArgumentsInOrder)
{
    answerCallback("folder/file", 17, &target);
    noticeCallback("other", 99, &target);
    EXPECT_THAT(target.received,
                ElementsAre(std::make_pair("folder/file", 17u), std::make_pair("other", 99u)));
}

TEST_F(Callback, GivesTheMembersResultUnchangedAlsoThroughTheLambda)
{
    const auto lambda =
        detail::makeCallbackImpl<&Target::answer>(std::tuple<const char *, unsigned, void *>());
    for (const int result : {0, 1, -1, -7, -30, 42, INT_MIN, INT_MAX})
    {
        target.body = [result] { return result; };
        EXPECT_EQ(answerCallback("path", 1, &target), result);
        EXPECT_EQ(lambda("path", 1, &target), result);
        EXPECT_EQ(pendingCallbackException(), nullptr) << result;
    }
}

TEST_F(Callback, ParksTheVeryObjectThatWasThrownInPlaceOfAnEarlierOneAndThroughALaterSuccess)
{
    for (const std::exception_ptr &thrown :
         {std::make_exception_ptr(std::runtime_error("failed")), std::make_exception_ptr(2)})
    {
        target.body = [&thrown]() -> int { std::rethrow_exception(thrown); };
        answerCallback("path", 1, &target);
        EXPECT_EQ(pendingCallbackException(), thrown);
        target.body = [] { return 0; };
        EXPECT_EQ(answerCallback("path", 1, &target), 0);
        EXPECT_EQ(pendingCallbackException(), thrown);
    }
}

/// Lets both callbacks throw, and expects the text of the exception and then a stack of each. Only
/// the one with a result parks it, with the user's code.
template <class Exception> void expectReports(const Exception &exception)
{
    const auto isReport =
        ElementsAre(isRecord(0x10, "Exception caught: " + diagnosticTextOf(exception)),
                    testing::AllOf(testing::Field(&test::LogRecord::severity, 0x200u),
                                   testing::Field(&test::LogRecord::message, StartsWith("0# "))));
    Target target;
    target.body = [&exception]() -> int { throw exception; };
    LogCapture log(SeverityException | SeverityStackTrace);
    EXPECT_EQ(answerCallback("path", 1, &target), -7);
    EXPECT_THAT(log.records(), isReport);
    const std::exception_ptr parked = pendingCallbackException();
    EXPECT_THROW(std::rethrow_exception(parked), Exception);
    log.clear();
    noticeCallback("path", 1, &target);
    EXPECT_THAT(log.records(), isReport);
    EXPECT_EQ(pendingCallbackException(), parked);
    pendingCallbackException() = nullptr;
    noticeCallback("path", 1, &target);
    EXPECT_EQ(pendingCallbackException(), nullptr);
}

TEST_F(Callback, ReportsAnExceptionOfAnyTypeAndThenTheStackAndParksItIfItHasAResult)
{
    expectReports(std::runtime_error("failed"));
    expectReports(CancelledOperationException());
    expectReports(BoostOnly());
    expectReports(42);
}

TEST_F(Callback, ReportsAtTheEnabledSeveritiesOnly)
{
    for (const unsigned severity : {0x10u, 0x200u})
    {
        const LogCapture log(severity);
        answerThrowing(std::runtime_error("failed"));
        ASSERT_EQ(log.records().size(), 1u);
        EXPECT_EQ(log.records()[0].severity, severity);
    }
    const LogCapture log(~(SeverityException | SeverityStackTrace | SeverityScopeEntry));
    EXPECT_EQ(answerThrowing(std::runtime_error("failed")), -7);
    EXPECT_THAT(log.records(), IsEmpty());
    EXPECT_NE(pendingCallbackException(), nullptr);
}

/// The one text under which a callback traces its entry and its exit.
template <class Call> std::string tracedAs(Call call)
{
    const LogCapture log(SeverityScopeEntry | SeverityScopeExit);
    call();
    const auto records = log.records();
    EXPECT_EQ(records.size(), 2u);
    EXPECT_EQ(records.front().severity, 0x20u);
    EXPECT_EQ(records.back().severity, 0x40u);
    EXPECT_EQ(records.front().message, records.back().message);
    return records.front().message;
}

#ifdef __clang__
// clang's text of a lambda has only the arguments' types.
constexpr const char *memberInSignature = "std::tuple<const char *, unsigned int, void *>";
#else
constexpr const char *memberInSignature = "Target::answer";
#endif

TEST_F(Callback, TracesEachInstanceUnderASignatureThatNamesTheMemberAlsoWhenItThrows)
{
    const auto other = makeCallback<&Target::otherAnswer, int (*)(unsigned, void *)>();
    const std::string one = tracedAs([this] { answerCallback("path", 1, &target); });
    const std::string two = tracedAs([this] { noticeCallback("path", 1, &target); });
    const std::string three = tracedAs([this, other] { other(1, &target); });
    EXPECT_THAT(one, HasSubstr("vclink::git::detail::makeCallbackImpl"));
    EXPECT_THAT(one, HasSubstr(memberInSignature));
    EXPECT_NE(one, two);
    EXPECT_NE(one, three);
    EXPECT_NE(two, three);
    EXPECT_EQ(tracedAs([this] { answerThrowing(1); }), one);
    EXPECT_EQ(logger().scope_depth(), 0);
}

TEST_F(Callback, CallsTheMemberAndReportsInsideItsScope)
{
    LogCapture log;
    std::vector<unsigned> severities;
    log.onRecord([&](const test::LogRecord &record) { severities.push_back(record.severity); });
    target.body = []() -> int
    {
        EXPECT_EQ(logger().scope_depth(), 1);
        throw std::runtime_error("failed");
    };
    answerCallback("path", 1, &target);
    EXPECT_EQ(logger().scope_depth(), 0);
    EXPECT_THAT(severities, ElementsAre(0x20u, 0x10u, 0x200u, 0x40u));
}

class CallbackDeathTest : public Callback
{
  protected:
    /// Expects that `call` ends the process if a record of this severity fails.
    template <class Call> static void expectDeath(unsigned severity, Call call)
    {
        const LogCapture log;
        EXPECT_DEATH(
            {
                const CoreFilter filter(
                    [severity](unsigned asked)
                    {
                        if (asked == severity)
                            throw std::logic_error("the sink failed");
                        return true;
                    });
                call();
            },
            "terminate called.*logic_error");
    }
};

TEST_F(CallbackDeathTest, EndsTheProcessWhenTheTraceOfItsEntryOrExitOrTheReportFails)
{
    target.body = []() -> int { throw 1; };
    const auto answer = [this] { answerCallback("path", 1, &target); };
    for (const unsigned severity : {SeverityScopeEntry, SeverityScopeExit, SeverityException})
        expectDeath(severity, answer);
    expectDeath(SeverityStackTrace, [this] { noticeCallback("path", 1, &target); });
}

} // namespace
} // namespace vclink::git
