// SPDX-License-Identifier: MIT
// Whether operations that a host repeats all day leave memory behind.
#include <cstddef>
#include <functional>

#include <gtest/gtest.h>
#include <malloc.h>

#include "main/remote/RemoteFixture.hpp"
#include "support/libgit2Release.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/BranchParameters.hpp"

/// Answers where the address sanitizer has taken malloc over.
extern "C" __attribute__((weak)) std::size_t
bytesOfTheSanitizer() __asm__("__sanitizer_get_current_allocated_bytes");

namespace
{

namespace git = vclink::git;

std::size_t heldBytes()
{
    return bytesOfTheSanitizer != nullptr ? bytesOfTheSanitizer() : ::mallinfo2().uordblks;
}

class Memory : public vclink::test::RemoteFixture
{
  protected:
    /// What is left of each call, of ten after the first, in which buffers grow to their size.
    static std::size_t bytesLeftBy(const std::function<void()> &operation)
    {
        operation();
        const std::size_t before = heldBytes();
        for (int i = 0; i < 10; ++i)
        {
            operation();
        }
        const std::size_t after = heldBytes();
        return after > before ? (after - before) / 10 : 0;
    }
    /// A release that loses memory loses far more than this each time.
    static constexpr std::size_t limit = 1024;
    static void expectNothingLeftByReleasesThatLoseNothing(const std::function<void()> &operation)
    {
        const std::size_t left = bytesLeftBy(operation);
        EXPECT_EQ(left > limit, vclink::test::libgit2_release::losesMemory) << left << " bytes";
    }
};

TEST_F(Memory, IsNotLostByAFetch)
{
    expectNothingLeftByReleasesThatLoseNothing([this] { fetch(); });
}

TEST_F(Memory, IsNotLostByAListingOfHeads)
{
    expectNothingLeftByReleasesThatLoseNothing([this] { remote().getRemoteHeads(); });
}

TEST_F(Memory, IsNotLostByTheDeletionOfABranch)
{
    commit("file", "text\n");
    const std::size_t left = bytesLeftBy(
        [this]
        {
            branches().createBranch(git::BranchParameters("short", "main"));
            branches().deleteBranch("short");
        });
    EXPECT_LE(left, limit);
}

} // namespace
