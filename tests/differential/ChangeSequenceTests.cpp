// SPDX-License-Identifier: MIT
#include <cstdlib>
#include <exception>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <map>
#include <set>
#include <string>

#include <gtest/gtest.h>

#include "ChangeSequence.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/numberFrom.hpp"

namespace
{

namespace fs = std::filesystem;
using vclink::test::ChangeSequence;
using vclink::test::numberFrom;

constexpr std::uint64_t sequenceBlocks = 4;
constexpr std::uint64_t sequencesInBlock = 13;
constexpr std::uint64_t variedSequences = 25;

/// 13 sequences a block, or as many as VCLINK_SEQUENCES says; a block ends with the first that
/// fails, and prints its seed and what was done. VCLINK_FIRST is the first seed of all; the preset
/// debug begins where release ends, so that no sequence is run twice. To run one
/// sequence again, run this program with the seed in VCLINK_SEED; every block is that sequence
/// alone then. VCLINK_KEEP besides names a path to which its working copies are moved in the end.
class ChangeSequences : public vclink::test::GitFixture,
                        public testing::WithParamInterface<std::uint64_t>
{
  protected:
    ChangeSequences()
    {
        std::ofstream(environment().home() / ".gitconfig")
            << "[user]\n\tname = Somebody\n\temail = somebody@example.com\n";
    }

    void run(std::uint64_t seed)
    {
        const fs::path path = folder() / std::to_string(seed);
        ChangeSequence sequence(seed, path);
        try
        {
            sequence.run();
        }
        catch (const std::exception &exception)
        {
            ADD_FAILURE() << exception.what();
        }
        if (HasFailure())
        {
            ADD_FAILURE() << "in the sequence of VCLINK_SEED=" << seed << ":\n"
                          << sequence.script();
        }
        for (const auto &[change, count] : sequence.counts())
        {
            counts_[change] += count;
        }
        if (const char *kept = std::getenv("VCLINK_KEEP"))
        {
            fs::rename(path, kept);
        }
        fs::remove_all(path);
    }

    /// How often each change was made, refusals apart.
    const std::map<std::string, int> &counts() const
    {
        return counts_;
    }

  private:
    vclink::test::LibGit2Session session_{environment()};
    std::map<std::string, int> counts_;
};

TEST_P(ChangeSequences, LeaveWhatGitLeaves)
{
    if (const char *seed = std::getenv("VCLINK_SEED"))
    {
        return run(std::stoull(seed));
    }
    const std::uint64_t inBlock = numberFrom("VCLINK_SEQUENCES", sequencesInBlock);
    const std::uint64_t first = numberFrom("VCLINK_FIRST", 0) + GetParam() * inBlock;
    for (auto seed = first; seed < first + inBlock && !HasFailure(); ++seed)
    {
        run(seed);
    }
    std::cout << "seeds " << first << " to " << first + inBlock - 1 << '\n';
    std::set<std::string> made;
    for (const auto &[change, count] : counts())
    {
        std::cout << "  " << count << " x " << change << '\n';
        made.insert(change.substr(0, change.find(", by git")));
    }
    // The suite's own blocks are known to hold every change, others if they are large enough.
    if (inBlock != sequencesInBlock && inBlock < variedSequences)
    {
        return;
    }
    for (const auto *change :
         {"add", "add: AlreadyAdded", "commit", "commit of a merge", "fast-forward: done",
          "fast-forward: refused", "markResolved", "merge", "merge by the library: done",
          "merge by the library: refused", "merge with conflicts", "remove",
          "remove: NoFilesToRemove", "revert", "revert: Conflicted", "switch: done",
          "switch: refused"})
    {
        EXPECT_EQ(made.count(change), 1u) << change << ": the sequences are too much alike";
    }
}

INSTANTIATE_TEST_SUITE_P(Blocks, ChangeSequences, testing::Range<std::uint64_t>(0, sequenceBlocks));

} // namespace
