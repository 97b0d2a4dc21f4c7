// SPDX-License-Identifier: MIT
#include <string>
#include <utility>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeFixture.hpp"
#include "error/logging/severity.hpp"
#include "main/merge/BranchMerger.hpp"
#include "support/LogCapture.hpp"
#include "support/Sentence.hpp"

namespace
{

namespace git = vclink::git;
using git::mergeAnalysisToText;
using git::mergePreferenceToText;
using testing::ElementsAre;
using namespace vclink::test;

const std::string mergeSignature = "virtual void vclink::git::BasicBranchManager::merge("
                                   "vclink::git::BranchManager::BranchName)";
constexpr unsigned tracing =
    git::SeverityScopeEntry | git::SeverityScopeExit | git::SeverityParameter;

TEST(MergeAnalysisText, HasTheWordsOfTheBitsInOneOrderWithABlankBehindEach)
{
    const std::string normal = "GIT_MERGE_ANALYSIS_NORMAL ";
    const std::string nothingToMerge = "GIT_MERGE_ANALYSIS_UP_TO_DATE ";
    const std::string fastForward = "GIT_MERGE_ANALYSIS_FASTFORWARD ";
    const std::string unborn = "GIT_MERGE_ANALYSIS_UNBORN ";
    const std::vector<std::pair<unsigned, std::string>> texts{
        {GIT_MERGE_ANALYSIS_NORMAL, normal},
        {GIT_MERGE_ANALYSIS_UP_TO_DATE, nothingToMerge},
        {GIT_MERGE_ANALYSIS_FASTFORWARD, fastForward},
        {GIT_MERGE_ANALYSIS_UNBORN, unborn},
        {1, normal},
        {2, nothingToMerge},
        {4, fastForward},
        {8, unborn},
        {5, fastForward + normal},
        {12, unborn + fastForward},
        {15, nothingToMerge + unborn + fastForward + normal},
        {0, ""},
        {0x12, nothingToMerge},
        {0xFFFFFFF0U, ""}};
    for (const auto &[bits, text] : texts)
        EXPECT_EQ(mergeAnalysisToText(bits), text) << bits;
}

TEST(MergePreferenceText, HasTheWordsOfTheBitsWithABlankBehindEach)
{
    const std::string no = "GIT_MERGE_PREFERENCE_NO_FASTFORWARD ";
    const std::string only = "GIT_MERGE_PREFERENCE_FASTFORWARD_ONLY ";
    const std::vector<std::pair<unsigned, std::string>> texts{
        {1, no}, {2, only}, {3, no + only}, {GIT_MERGE_PREFERENCE_NONE, ""}, {0xFFFFFFFCU, ""}};
    for (const auto &[bits, text] : texts)
        EXPECT_EQ(mergePreferenceToText(bits), text) << bits;
}

using MergeLog = MergeFixture;

/// What is merged, what the two records about it say and whether the merge fails then.
struct Decision : Sentence
{
    Change prepare;
    std::string analysis;
    std::string preference{};
    bool isFailure = false;
    std::string name = "topic";
};

class MergeDecision : public MergeLog, public testing::WithParamInterface<Decision>
{
};

TEST_P(MergeDecision, IsToldAmongTheDiagnosticsAndNothingElse)
{
    makeAhead();
    repository_.git({"branch", "ahead", "topic"});
    if (GetParam().prepare)
        GetParam().prepare(repository_);
    const LogCapture log(git::SeverityDiagnostic);
    if (GetParam().isFailure)
        failureOfMerge(GetParam().name);
    else
        merge(GetParam().name);
    EXPECT_THAT(log.messages(), ElementsAre("Merge Analysis: " + GetParam().analysis,
                                            "Merge Preference: " + GetParam().preference));
}

const Change divergence =
    runsGit({"-c", "user.name=x", "-c", "user.email=x", "commit", "-qm.", "--allow-empty"});
const Decision decisions[]{
    {{"OfABranchThatIsUpToDate"}, {}, "GIT_MERGE_ANALYSIS_UP_TO_DATE ", "", false, "main"},
    {{"OfAFastForward"}, {}, "GIT_MERGE_ANALYSIS_FASTFORWARD GIT_MERGE_ANALYSIS_NORMAL "},
    {{"OfATrueMerge"}, divergence, "GIT_MERGE_ANALYSIS_NORMAL "},
    {{"AgainstFastForwards"},
     runsGit({"config", "merge.ff", "false"}),
     "GIT_MERGE_ANALYSIS_FASTFORWARD GIT_MERGE_ANALYSIS_NORMAL ",
     "GIT_MERGE_PREFERENCE_NO_FASTFORWARD "},
    {{"ForFastForwardsOnly"},
     divergence + runsGit({"config", "merge.ff", "only"}),
     "GIT_MERGE_ANALYSIS_NORMAL ",
     "GIT_MERGE_PREFERENCE_FASTFORWARD_ONLY ",
     true},
    {{"OnAnUnbornBranch"},
     runsGit({"checkout", "--quiet", "--orphan", "unborn"}),
     "GIT_MERGE_ANALYSIS_UNBORN GIT_MERGE_ANALYSIS_FASTFORWARD ",
     "",
     true,
     "main"},
};

INSTANTIATE_TEST_SUITE_P(The, MergeDecision, testing::ValuesIn(decisions),
                         testing::PrintToStringParamName());

TEST_F(MergeLog, TellsNothingOfTheAnalysisBeforeIt)
{
    const LogCapture log(git::SeverityDiagnostic);
    failureOfMerge("missing");
    EXPECT_THAT(log.messages(), ElementsAre("Throwing error revspec 'missing' not found (-3)"));
}

TEST_F(MergeLog, TellsOfTheExceptionThatItTurnsIntoAFailedMerge)
{
    makeDiverged();
    prefer("only");
    const LogCapture log(git::SeverityException);
    EXPECT_ANY_THROW(merge("topic"));
    ASSERT_EQ(log.messages().size(), 1U);
    EXPECT_THAT(log.messages().front(), testing::StartsWith("Exception caught: "));
    EXPECT_THAT(log.messages().front(), testing::HasSubstr("MergePreferenceFastForward"));
}

TEST_F(MergeLog, TracesTheMergeWithItsParameter)
{
    const LogCapture log(tracing);
    merge("main");
    EXPECT_THAT(log.messages(), ElementsAre(mergeSignature, " branchName=main", mergeSignature));
    EXPECT_EQ(log.records()[0].severity, git::SeverityScopeEntry);
    EXPECT_EQ(log.records()[1].severity, git::SeverityParameter);
    EXPECT_EQ(log.records()[2].severity, git::SeverityScopeExit);
}

TEST_F(MergeLog, TracesAMergeThatFails)
{
    repository_.remove(".git");
    const LogCapture log(tracing);
    EXPECT_THAT(failureOfMerge("topic"), testing::HasSubstr("(code -3, category 6)"));
    const auto messages = log.messages();
    ASSERT_GE(messages.size(), 3U);
    EXPECT_EQ(messages[0], mergeSignature);
    EXPECT_EQ(messages[1], " branchName=topic");
    EXPECT_EQ(messages.back(), mergeSignature + " [throw]");
}

} // namespace
