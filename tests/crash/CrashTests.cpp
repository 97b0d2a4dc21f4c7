// SPDX-License-Identifier: MIT
#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <iostream>
#include <map>
#include <set>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "Casualty.hpp"
#include "InterruptedMerge.hpp"
#include "Workplace.hpp"
#include "differential/Comparison.hpp"
#include "differential/Random.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/numberFrom.hpp"

namespace
{

using std::chrono::microseconds;
using namespace vclink::test;

const std::vector<std::string> operations{
    "commit",      "revertFiles", "switchBranch", "mergeFastForward", "mergeThreeWay",
    "mergeDriven", "fetch",       "push",         "generate",         "writeConfig"};

/// Workers that are killed one after the other. VCLINK_KILLS says how many, VCLINK_SEED when. With
/// VCLINK_KEEP the workplace of a test that fails stays, beside where the test's folder was.
class Crash : public GitFixture
{
  protected:
    using Counts = std::map<std::string, std::size_t>;

    void TearDown() override
    {
        if (!HasFailure() || std::getenv("VCLINK_KEEP") == nullptr)
            return;
        const std::string kept = folder().path().string() + "-kept";
        std::filesystem::rename(workplace_.path(), kept);
        std::cout << "The workplace is kept in " << kept << '\n';
    }
    /// Has a worker repeat what the last one was killed in, and kills it in `operation`.
    void killIn(const std::string &operation)
    {
        if (operation == "fetch" || last_ == "fetch")
            workplace_.advanceUpstream();
        Casualty worker({VCLINK_CRASH_WORKER, workplace_.path(),
                         std::to_string(random_.below(1U << 30)), last_, operation});
        ASSERT_TRUE(worker.awaitReports(2)) << last_ << " does not work after one was killed";
        ASSERT_TRUE(worker.awaitReports(3)) << operation << " can't be prepared";
        const auto longest = static_cast<std::size_t>(timeOf(operation).count());
        worker.killAfter(microseconds(random_.below(longest)));
        remember(worker);
        interrupted_ = worker.interrupted();
        ++(interrupted_.empty() ? outside_[operation] : inside_[interrupted_]);
        last_ = operation;
    }
    void recover()
    {
        workplace_.expectNothingLost(commits_, pushed_);
        if (workplace_.removeLocks() != 0)
            ++locked_[interrupted_];
        if (workplace_.isMerging())
            concludeMerge();
        Comparison(workplace_.repository(), random_.below(1U << 30)).compareAll();
    }
    /// Commits as if nothing had happened. If that is refused, follows the text of the refusal.
    void concludeMerge()
    {
        ++merging_[interrupted_];
        InterruptedMerge merge(workplace_.repository());
        if (merge.commit())
            return;
        ++refused_[interrupted_];
        merge.beginAgain();
    }
    void report() const
    {
        for (const auto &operation : operations)
        {
            const auto count = [&](const Counts &kills)
            { return kills.count(operation) == 0 ? std::size_t{0} : kills.at(operation); };
            std::cout << operation << ": killed inside " << count(inside_)
                      << ", of these left a lock " << count(locked_) << ", a merge "
                      << count(merging_) << ", where a commit was refused " << count(refused_)
                      << "; after the end " << count(outside_) << "; a run took "
                      << timeOf(operation).count() << " us\n";
        }
        std::cout << sumOf(inside_) + sumOf(outside_) << " kills, " << sumOf(inside_)
                  << " of them inside; " << commits_.size() << " commits kept, " << sumOf(locked_)
                  << " times locks removed, " << sumOf(merging_) << " merges concluded, "
                  << sumOf(refused_) << " of them begun again\n";
    }
    static std::size_t sumOf(const Counts &counts)
    {
        std::size_t sum = 0;
        for (const auto &[operation, count] : counts)
            sum += count;
        return sum;
    }
    const Counts &killsInside() const
    {
        return inside_;
    }
    std::size_t refusals() const
    {
        return sumOf(refused_);
    }

  private:
    microseconds timeOf(const std::string &operation) const
    {
        const auto found = times_.find(operation);
        return found == times_.end() ? microseconds(20'000) : found->second;
    }
    /// The commits that stand, and how long the operations take that were let to their end.
    void remember(const Casualty &worker)
    {
        const auto &reports = worker.reports();
        for (std::size_t end = 1; end < reports.size(); ++end)
        {
            if (!reports[end].isEnd)
                continue;
            commits_.insert(reports[end].id);
            if (reports[end].operation == "push")
                pushed_.insert(reports[end].id);
            const auto time =
                std::chrono::duration_cast<microseconds>(reports[end].time - reports[end - 1].time);
            times_[reports[end].operation] = std::max(time, microseconds(500));
        }
    }

    LibGit2Session session_{environment()};
    Workplace workplace_{folder() / "workplace", environment().home()};
    Random random_{numberFrom("VCLINK_SEED", 1)};
    std::string last_ = "commit";
    std::string interrupted_;
    std::map<std::string, microseconds> times_;
    Counts inside_;
    Counts outside_;
    /// Kills inside that left a lock, and a merge under way.
    Counts locked_;
    Counts merging_;
    /// Kills that left a merge that no commit may conclude.
    Counts refused_;
    std::set<std::string> commits_;
    std::set<std::string> pushed_;
};

TEST_F(Crash, LosesNothingAndTheNextOperationWorks)
{
    const auto kills = static_cast<std::size_t>(numberFrom("VCLINK_KILLS", 30));
    // Some more for operations that no kill has hit yet: machines differ in speed.
    const std::size_t most = kills + 5 * operations.size();
    for (std::size_t kill = 0; kill < most && !HasFailure(); ++kill)
    {
        const std::string &operation = operations[kill % operations.size()];
        if (kill >= kills && killsInside().count(operation) != 0)
            continue;
        SCOPED_TRACE("kill " + std::to_string(kill));
        killIn(operation);
        if (!HasFatalFailure())
            recover();
    }
    report();
    // With fewer kills inside, the test proves nothing.
    EXPECT_GE(sumOf(killsInside()) * 2, kills);
    EXPECT_GE(refusals(), kills / 300) << "no kill left a merge whose commit is refused";
    for (const auto &operation : operations)
        EXPECT_EQ(killsInside().count(operation), 1U) << "no kill fell into " << operation;
}

} // namespace
