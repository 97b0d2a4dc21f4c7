// SPDX-License-Identifier: MIT
#include "options/RemoteCallbacks.hpp"

#include <cstddef>
#include <cstdint>
#include <functional>
#include <limits>
#include <map>
#include <stdexcept>
#include <string>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/CoreFilter.hpp"
#include "error/HermeticLibGit2.hpp"
#include "error/logging/severity.hpp"
#include "support/LogCapture.hpp"
#include "support/TestInteractor.hpp"
#include "support/isRecord.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::git
{
namespace
{

using test::CoreFilter;
using test::isRecord;
using test::LogCapture;
using testing::ElementsAre;
using testing::IsEmpty;
using vclink::util::exception::CancelledOperationException;

constexpr unsigned greatestCount = std::numeric_limits<unsigned>::max();

/// An address that can't be read.
template <class Object> Object *nowhere()
{
    return reinterpret_cast<Object *>(std::uintptr_t{8});
}

git_indexer_progress makeStats(unsigned totalObjects, std::size_t receivedBytes)
{
    git_indexer_progress stats = {};
    stats.total_objects = totalObjects;
    stats.received_bytes = receivedBytes;
    stats.indexed_objects = 7;
    stats.received_objects = 8;
    return stats;
}

class RemoteCallbacksTest : public testing::Test
{
  protected:
    using Calls = std::map<std::string, std::function<int()>>;

    /// One call of each member that does not poll and reaches no agent.
    Calls quietCalls()
    {
        auto &set = callbacks_;
        return {
            {"completion", [&] { return set.completion(GIT_REMOTE_COMPLETION_DOWNLOAD); }},
            {"certificateCheck", [&] { return set.certificateCheck(nullptr, 0, "host"); }},
            {"updateTips", [&] { return set.updateTips("ref", nullptr, nullptr); }},
            {"packProgress", [&] { return set.packProgress(0, 1, 2); }},
            {"pushTransferProgress", [&] { return set.pushTransferProgress(1, 2, 3); }},
            {"pushUpdateReference", [&] { return set.pushUpdateReference("ref", nullptr); }},
            {"pushNegotiation", [&] { return set.pushNegotiation(nullptr, 1); }},
        };
    }
    int sayNothing()
    {
        return callbacks_.sidebandProgress("", 0);
    }
    int transferNothing()
    {
        const git_indexer_progress stats = {};
        return callbacks_.transferProgress(&stats);
    }
    // The members are called by libgit2 alone.
    test::HermeticLibGit2 libgit2_;
    test::TestInteractor interactor_;
    RemoteCallbacks callbacks_{interactor_};
};

using SidebandProgress = RemoteCallbacksTest;
using TransferProgress = RemoteCallbacksTest;
using CertificateCheck = RemoteCallbacksTest;
using PushUpdateReference = RemoteCallbacksTest;

TEST_F(SidebandProgress, TellsAsManyBytesAsItIsGivenInOneRecord)
{
    const LogCapture log;
    const char text[] = {'a', '\0', 'b', 'c', 'd'};
    EXPECT_EQ(callbacks_.sidebandProgress("remote: \xC3\xBC\n", 11), 0);
    EXPECT_EQ(callbacks_.sidebandProgress(text, 4), 0);
    EXPECT_EQ(sayNothing(), 0);
    EXPECT_EQ(callbacks_.sidebandProgress(nullptr, 0), 0);
    EXPECT_THAT(log.records(),
                ElementsAre(isRecord(SeverityParameter, " msgStr=remote: \xC3\xBC\n"),
                            isRecord(SeverityParameter, " msgStr=" + std::string("a\0bc", 4)),
                            isRecord(SeverityParameter, " msgStr="),
                            isRecord(SeverityParameter, " msgStr=")));
}

TEST_F(SidebandProgress, MakesItsTextBeforeTheSeverityIsTested)
{
    const LogCapture log(~unsigned{SeverityParameter});
    EXPECT_THROW(callbacks_.sidebandProgress("text", -1), std::length_error);
}

TEST_F(TransferProgress, TellsObjectsAndBytesBackToBack)
{
    const LogCapture log;
    const git_indexer_progress stats = makeStats(100, 2048);
    EXPECT_EQ(callbacks_.transferProgress(&stats), 0);
    const git_indexer_progress most =
        makeStats(greatestCount, std::numeric_limits<std::size_t>::max());
    EXPECT_EQ(callbacks_.transferProgress(&most), 0);
    EXPECT_THAT(
        log.records(),
        ElementsAre(
            isRecord(SeverityProgress, "Transfer Progress (Objects / Bytes): 1002048"),
            isRecord(SeverityProgress,
                     "Transfer Progress (Objects / Bytes): 429496729518446744073709551615")));
}

TEST_F(RemoteCallbacksTest, PollBeforeAllElseInTwoOfThemAndForgetARequestThatOneHasSeen)
{
    const LogCapture log;
    const std::function<int()> polls[] = {
        [this] { return callbacks_.sidebandProgress(nowhere<const char>(), 100); },
        [this] { return callbacks_.transferProgress(nowhere<const git_indexer_progress>()); }};
    for (const auto &poll : polls)
    {
        interactor_.cancel();
        interactor_.cancel();
        EXPECT_THROW(poll(), CancelledOperationException);
        EXPECT_THAT(log.records(), IsEmpty());
    }
    EXPECT_EQ(transferNothing(), 0);
    EXPECT_EQ(sayNothing(), 0);
}

TEST_F(RemoteCallbacksTest, PollNowhereElseAndMoveNoProgress)
{
    interactor_.cancel();
    for (const auto &[name, call] : quietCalls())
        EXPECT_EQ(call(), 0) << name;
    git_credential *credential = nullptr;
    EXPECT_EQ(callbacks_.credentials(&credential, "url", "user", GIT_CREDENTIAL_USERNAME), -1);
    EXPECT_THROW(transferNothing(), CancelledOperationException);
    EXPECT_THAT(interactor_.progress.calls, IsEmpty());
}

TEST_F(RemoteCallbacksTest, TellTheirArgumentsInOneRecordEach)
{
    const LogCapture log;
    callbacks_.completion(GIT_REMOTE_COMPLETION_DOWNLOAD);
    callbacks_.completion(GIT_REMOTE_COMPLETION_ERROR);
    callbacks_.updateTips("refs/heads/gr\xC3\xBC\xC3\x9F", nowhere<const git_oid>(),
                          nowhere<const git_oid>());
    callbacks_.packProgress(1, 2, greatestCount);
    callbacks_.packProgress(-1, 0, 0);
    callbacks_.pushTransferProgress(4, 5, std::numeric_limits<std::size_t>::max());
    callbacks_.pushNegotiation(nowhere<const git_push_update *>(), 3);
    EXPECT_EQ(callbacks_.updateTips(nullptr, nullptr, nullptr), 0);
    EXPECT_THAT(
        log.records(),
        ElementsAre(isRecord(SeverityParameter, " type=0"), isRecord(SeverityParameter, " type=2"),
                    isRecord(SeverityParameter, " ref=refs/heads/gr\xC3\xBC\xC3\x9F"),
                    isRecord(SeverityParameter, " stage=1 current=2 total=4294967295"),
                    isRecord(SeverityParameter, " stage=-1 current=0 total=0"),
                    isRecord(SeverityParameter, " current=4 total=5 bytes=18446744073709551615"),
                    isRecord(SeverityParameter, " len=3"), isRecord(SeverityParameter, " ref=")));
}

TEST_F(RemoteCallbacksTest, WriteNothingWhenTheirSeverityIsOff)
{
    const LogCapture log(~unsigned{SeverityParameter});
    int opened = 0;
    const CoreFilter filter([&opened](unsigned) { return ++opened > 0; });
    for (const auto &[name, call] : quietCalls())
        EXPECT_EQ(call(), 0) << name;
    git_credential *credential = nullptr;
    EXPECT_EQ(callbacks_.credentials(&credential, nullptr, nullptr, 0), -1);
    EXPECT_EQ(callbacks_.sidebandProgress("text", 4), 0);
    const LogCapture withoutProgress(~unsigned{SeverityProgress});
    EXPECT_EQ(transferNothing(), 0);
    EXPECT_THAT(log.records(), IsEmpty());
    EXPECT_EQ(opened, 0) << "a record was begun";
}

/// 1 leaves libgit2's own finding, which was good then; 0 goes ahead.
TEST_F(CertificateCheck, AnswersWithTheFindingAndRefusesNothing)
{
    const LogCapture log;
    EXPECT_EQ(callbacks_.certificateCheck(nowhere<git_cert>(), 0, "example.com"), 0);
    EXPECT_EQ(callbacks_.certificateCheck(nowhere<git_cert>(), 1, "example.com"), 1);
    EXPECT_EQ(callbacks_.certificateCheck(nullptr, 1, nullptr), 1);
    EXPECT_THAT(log.records(), ElementsAre(isRecord(SeverityParameter, " valid=0 host=example.com"),
                                           isRecord(SeverityParameter, " valid=1 host=example.com"),
                                           isRecord(SeverityParameter, " valid=1 host=")));
}

TEST_F(PushUpdateReference, TakesARejectedReferenceForDone)
{
    const LogCapture log;
    EXPECT_EQ(callbacks_.pushUpdateReference("refs/heads/main", nullptr), 0);
    EXPECT_EQ(callbacks_.pushUpdateReference("refs/heads/main", "pre-receive hook declined"), 0);
    EXPECT_EQ(callbacks_.pushUpdateReference(nullptr, ""), 0);
    EXPECT_THAT(
        log.records(),
        ElementsAre(isRecord(SeverityParameter, " refnameStr=refs/heads/main statusStr="),
                    isRecord(SeverityParameter,
                             " refnameStr=refs/heads/main statusStr=pre-receive hook declined"),
                    isRecord(SeverityParameter, " refnameStr= statusStr=")));
}

} // namespace
} // namespace vclink::git
