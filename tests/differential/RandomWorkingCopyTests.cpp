// SPDX-License-Identifier: MIT
#include <cstdlib>
#include <exception>
#include <filesystem>
#include <numeric>
#include <set>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "Comparison.hpp"
#include "RandomWorkingCopy.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"

namespace
{

namespace fs = std::filesystem;
using vclink::FileState;
using namespace vclink::test;

constexpr std::uint64_t copyBlocks = 20;
constexpr std::uint64_t copiesInBlock = 25;
constexpr std::size_t stateCount = 8;

int countFailures()
{
    return testing::UnitTest::GetInstance()->current_test_info()->result()->total_part_count();
}

/// 25 working copies a block. Each failure prints the seed of its copy and what was done to make
/// it. To make one copy again, run this program with the seed in VCLINK_SEED; every block is that
/// copy alone then. VCLINK_KEEP besides names a path to which the copy is moved in the end.
class RandomWorkingCopies : public GitFixture, public testing::WithParamInterface<std::uint64_t>
{
  protected:
    void compareCopy(std::uint64_t seed)
    {
        const fs::path path = folder() / std::to_string(seed);
        const int failuresBefore = countFailures();
        RandomWorkingCopy copy(seed, path, other_);
        try
        {
            copy.make();
            Comparison comparison(copy.repository(), seed);
            comparison.compareAll();
            states_.insert(comparison.states().begin(), comparison.states().end());
        }
        catch (const std::exception &exception)
        {
            ADD_FAILURE() << exception.what();
        }
        if (countFailures() != failuresBefore)
        {
            ADD_FAILURE() << "in the working copy of VCLINK_SEED=" << seed << ", made by\n"
                          << copy.script();
        }
        if (const char *kept = std::getenv("VCLINK_KEEP"))
        {
            fs::rename(path, kept);
        }
        fs::remove_all(path);
    }

    /// The states that the files of the copies have.
    const std::set<FileState::State> &states() const
    {
        return states_;
    }

  private:
    LibGit2Session session_{environment()};
    OtherRepository other_{folder() / "other"};
    std::set<FileState::State> states_;
};

TEST_P(RandomWorkingCopies, HaveTheStatesThatGitReports)
{
    if (const char *seed = std::getenv("VCLINK_SEED"))
    {
        return compareCopy(std::stoull(seed));
    }
    std::vector<std::uint64_t> seeds(copiesInBlock);
    std::iota(seeds.begin(), seeds.end(), GetParam() * copiesInBlock);
    for (const auto seed : seeds)
    {
        compareCopy(seed);
    }
    EXPECT_EQ(states().size(), stateCount) << "the copies are too much alike";
}

INSTANTIATE_TEST_SUITE_P(Blocks, RandomWorkingCopies, testing::Range<std::uint64_t>(0, copyBlocks));

} // namespace
