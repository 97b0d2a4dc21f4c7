// SPDX-License-Identifier: MIT
#include <cstdlib>
#include <exception>
#include <filesystem>
#include <iostream>
#include <string>

#include <gtest/gtest.h>

#include "RandomWorkingCopy.hpp"
#include "RefreshHazards.hpp"
#include "RefreshedIndex.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/numberFrom.hpp"

namespace
{

namespace fs = std::filesystem;
using namespace vclink::test;

constexpr std::uint64_t refreshBlocks = 2;
constexpr std::uint64_t refreshesInBlock = 15;

/// What both make of it, whichever comes first.
struct Refreshed
{
    std::string library;
    std::string floor;
};

Refreshed refresh(const GitRepository &repository, bool isLibraryFirst)
{
    Refreshed refreshed;
    if (isLibraryFirst)
    {
        refreshed.library = refreshByLibrary(repository);
    }
    refreshed.floor = refreshByLibGit2(repository);
    if (!isLibraryFirst)
    {
        refreshed.library = refreshByLibrary(repository);
    }
    return refreshed;
}

/// By the owner, who is not root.
Refreshed refreshAsOwner(const GitRepository &repository, bool isLibraryFirst)
{
    constexpr char separator = '\0';
    giveToUnprivilegedUser(repository.path());
    const std::string both = runAsUnprivilegedUser(
        [&]
        {
            const Refreshed refreshed = refresh(repository, isLibraryFirst);
            return refreshed.library + separator + refreshed.floor;
        });
    const auto end = both.find(separator);
    return {both.substr(0, end), both.substr(end + 1)};
}

/// 15 working copies a block, or as many as VCLINK_COPIES says, beginning with the seed in
/// VCLINK_FIRST_COPY. Each failure prints the seed of its copy and what was done to make it. To
/// make one copy again, run this program with the seed in VCLINK_SEED; every block is that copy
/// alone then. VCLINK_KEEP besides names a path to which the copy is moved in the end.
class RefreshOfRandomWorkingCopies : public GitFixture,
                                     public testing::WithParamInterface<std::uint64_t>
{
  protected:
    void compareCopy(std::uint64_t seed)
    {
        const fs::path path = folder() / std::to_string(seed);
        RandomWorkingCopy copy(seed, path, other_);
        copy.make();
        Random random(seed + 1);
        RefreshHazards hazards(random, copy.repository());
        hazards.add();
        const bool isLibraryFirst = random.chance(50);
        const Refreshed refreshed = hazards.hasUnreadable()
                                        ? refreshAsOwner(copy.repository(), isLibraryFirst)
                                        : refresh(copy.repository(), isLibraryFirst);
        EXPECT_EQ(refreshed.library, refreshed.floor)
            << "in the working copy of VCLINK_SEED=" << seed << ", made by\n"
            << copy.script() << hazards.script();
        const bool isFailure = refreshed.floor.find('\n') == std::string::npos;
        ++(isFailure ? failed_ : refreshed_);
        if (const char *kept = std::getenv("VCLINK_KEEP"))
        {
            fs::rename(path, kept);
        }
        fs::remove_all(path);
    }

    int failed_ = 0;
    int refreshed_ = 0;

  private:
    LibGit2Session session_{environment()};
    OtherRepository other_{folder() / "other"};
};

TEST_P(RefreshOfRandomWorkingCopies, IsThatOfLibGit2Alone)
{
    if (const char *seed = std::getenv("VCLINK_SEED"))
    {
        return compareCopy(std::stoull(seed));
    }
    const std::uint64_t inBlock = numberFrom("VCLINK_COPIES", refreshesInBlock);
    const std::uint64_t first = numberFrom("VCLINK_FIRST_COPY", 0) + GetParam() * inBlock;
    for (auto seed = first; seed < first + inBlock; ++seed)
    {
        compareCopy(seed);
    }
    std::cout << "seeds " << first << " to " << first + inBlock - 1 << ": " << refreshed_
              << " refreshed, " << failed_ << " failed\n";
    EXPECT_GT(refreshed_, failed_) << "too few copies can be refreshed";
}

INSTANTIATE_TEST_SUITE_P(Blocks, RefreshOfRandomWorkingCopies,
                         testing::Range<std::uint64_t>(0, refreshBlocks));

} // namespace
