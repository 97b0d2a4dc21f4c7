// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "MergeFixture.hpp"
#include "error/logging/severity.hpp"
#include "main/merge/BranchMerger.hpp"
#include "support/LogCapture.hpp"

namespace
{

namespace git = vclink::git;
using git::mergeAnalysisToText;
using git::mergePreferenceToText;
using testing::ElementsAre;
using vclink::test::LogCapture;
using vclink::test::LogRecord;

const std::string mergeSignature = "virtual void vclink::git::BasicBranchManager::merge("
                                   "vclink::git::BranchManager::BranchName)";
constexpr unsigned tracing =
    git::SeverityScopeEntry | git::SeverityScopeExit | git::SeverityParameter;

TEST(MergeAnalysisText, NamesEachBitWithABlankBehindIt)
{
    EXPECT_EQ(mergeAnalysisToText(GIT_MERGE_ANALYSIS_NORMAL), "GIT_MERGE_ANALYSIS_NORMAL ");
    EXPECT_EQ(mergeAnalysisToText(GIT_MERGE_ANALYSIS_UP_TO_DATE), "GIT_MERGE_ANALYSIS_UP_TO_DATE ");
    EXPECT_EQ(mergeAnalysisToText(GIT_MERGE_ANALYSIS_FASTFORWARD),
              "GIT_MERGE_ANALYSIS_FASTFORWARD ");
    EXPECT_EQ(mergeAnalysisToText(GIT_MERGE_ANALYSIS_UNBORN), "GIT_MERGE_ANALYSIS_UNBORN ");
}

TEST(MergeAnalysisText, GoesByTheseNumbers)
{
    EXPECT_EQ(mergeAnalysisToText(1), "GIT_MERGE_ANALYSIS_NORMAL ");
    EXPECT_EQ(mergeAnalysisToText(2), "GIT_MERGE_ANALYSIS_UP_TO_DATE ");
    EXPECT_EQ(mergeAnalysisToText(4), "GIT_MERGE_ANALYSIS_FASTFORWARD ");
    EXPECT_EQ(mergeAnalysisToText(8), "GIT_MERGE_ANALYSIS_UNBORN ");
}

TEST(MergeAnalysisText, HasItsWordsInOneOrder)
{
    EXPECT_EQ(mergeAnalysisToText(15), "GIT_MERGE_ANALYSIS_UP_TO_DATE GIT_MERGE_ANALYSIS_UNBORN "
                                       "GIT_MERGE_ANALYSIS_FASTFORWARD GIT_MERGE_ANALYSIS_NORMAL ");
    EXPECT_EQ(mergeAnalysisToText(5), "GIT_MERGE_ANALYSIS_FASTFORWARD GIT_MERGE_ANALYSIS_NORMAL ");
    EXPECT_EQ(mergeAnalysisToText(12), "GIT_MERGE_ANALYSIS_UNBORN GIT_MERGE_ANALYSIS_FASTFORWARD ");
}

TEST(MergeAnalysisText, IsEmptyForNoBitsAndUnknownOnes)
{
    EXPECT_EQ(mergeAnalysisToText(0), "");
    EXPECT_EQ(mergeAnalysisToText(0xFFFFFFF0U), "");
    EXPECT_EQ(mergeAnalysisToText(0x12), "GIT_MERGE_ANALYSIS_UP_TO_DATE ");
}

TEST(MergePreferenceText, NamesEachBitWithABlankBehindIt)
{
    EXPECT_EQ(mergePreferenceToText(1), "GIT_MERGE_PREFERENCE_NO_FASTFORWARD ");
    EXPECT_EQ(mergePreferenceToText(2), "GIT_MERGE_PREFERENCE_FASTFORWARD_ONLY ");
    EXPECT_EQ(mergePreferenceToText(3),
              "GIT_MERGE_PREFERENCE_NO_FASTFORWARD GIT_MERGE_PREFERENCE_FASTFORWARD_ONLY ");
}

TEST(MergePreferenceText, IsEmptyForNoBitsAndUnknownOnes)
{
    EXPECT_EQ(mergePreferenceToText(GIT_MERGE_PREFERENCE_NONE), "");
    EXPECT_EQ(mergePreferenceToText(0xFFFFFFFCU), "");
}

class MergeLog : public vclink::test::MergeFixture
{
  protected:
    /// The diagnostic records of a merge that may fail, without those of drivers and failures.
    std::vector<std::string> decisions(const std::string &name) const
    {
        const LogCapture log(git::SeverityDiagnostic);
        try
        {
            merge(name);
        }
        catch (const std::exception &)
        {
            failed_ = true;
        }
        return log.messages();
    }

    mutable bool failed_ = false;
};

TEST_F(MergeLog, TellsOfUpToDateAndNothingElse)
{
    EXPECT_THAT(decisions("main"), ElementsAre("Merge Analysis: GIT_MERGE_ANALYSIS_UP_TO_DATE ",
                                               "Merge Preference: "));
    EXPECT_FALSE(failed_);
}

TEST_F(MergeLog, TellsOfAFastForward)
{
    makeAhead();
    EXPECT_THAT(decisions("topic"), ElementsAre("Merge Analysis: GIT_MERGE_ANALYSIS_FASTFORWARD "
                                                "GIT_MERGE_ANALYSIS_NORMAL ",
                                                "Merge Preference: "));
    EXPECT_FALSE(failed_);
}

TEST_F(MergeLog, TellsOfATrueMerge)
{
    makeDiverged();
    EXPECT_THAT(decisions("topic"),
                ElementsAre("Merge Analysis: GIT_MERGE_ANALYSIS_NORMAL ", "Merge Preference: "));
    EXPECT_FALSE(failed_);
}

TEST_F(MergeLog, TellsThatFastForwardsAreNotWanted)
{
    makeAhead();
    prefer("false");
    EXPECT_THAT(decisions("topic"),
                ElementsAre("Merge Analysis: GIT_MERGE_ANALYSIS_FASTFORWARD "
                            "GIT_MERGE_ANALYSIS_NORMAL ",
                            "Merge Preference: GIT_MERGE_PREFERENCE_NO_FASTFORWARD "));
}

TEST_F(MergeLog, TellsThatOnlyFastForwardsAreAllowed)
{
    makeDiverged();
    prefer("only");
    EXPECT_THAT(decisions("topic"),
                ElementsAre("Merge Analysis: GIT_MERGE_ANALYSIS_NORMAL ",
                            "Merge Preference: GIT_MERGE_PREFERENCE_FASTFORWARD_ONLY "));
    EXPECT_TRUE(failed_);
}

TEST_F(MergeLog, TellsOfAnUnbornBranch)
{
    repository_.git({"checkout", "--quiet", "--orphan", "unborn"});
    EXPECT_THAT(decisions("main"), ElementsAre("Merge Analysis: GIT_MERGE_ANALYSIS_UNBORN "
                                               "GIT_MERGE_ANALYSIS_FASTFORWARD ",
                                               "Merge Preference: "));
    EXPECT_TRUE(failed_);
}

TEST_F(MergeLog, TellsNothingOfTheAnalysisBeforeIt)
{
    EXPECT_THAT(decisions("missing"),
                ElementsAre("Throwing error revspec 'missing' not found (-3)"));
    EXPECT_TRUE(failed_);
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

TEST_F(MergeLog, HasTheAnalysisAmongTheDiagnostics)
{
    const LogCapture log;
    merge("main");
    std::vector<unsigned> severities;
    for (const LogRecord &record : log.records())
    {
        if (record.message.rfind("Merge ", 0) == 0)
            severities.push_back(record.severity);
    }
    EXPECT_THAT(severities, ElementsAre(git::SeverityDiagnostic, git::SeverityDiagnostic));
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
    EXPECT_ANY_THROW(merge("topic"));
    const auto messages = log.messages();
    ASSERT_GE(messages.size(), 3U);
    EXPECT_EQ(messages[0], mergeSignature);
    EXPECT_EQ(messages[1], " branchName=topic");
    EXPECT_EQ(messages.back(), mergeSignature + " [throw]");
}

} // namespace
