// SPDX-License-Identifier: MIT
#include <cstddef>
#include <cstring>

#include <gtest/gtest.h>

#include "support/AllocationCounter.hpp"
#include "support/text.hpp"
#include "util/path/paths.hpp"

namespace
{

using vclink::git::joinRepositoryPath;
using vclink::test::AllocationCounter;

constexpr const char *longName = "a/folder/of/some/depth/and/a/file/of/40.txt";

TEST(JoinRepositoryPathAllocation, TakesOneForTheNameAndOneForTheKey)
{
    const upath root(u"/home/somebody/code/repository");
    const AllocationCounter counter;
    const upath joined = joinRepositoryPath(root, longName);
    EXPECT_EQ(counter.count(), 2U);
    EXPECT_EQ(joined.string().size(), root.string().size() + 1 + std::strlen(longName));
}

TEST(JoinRepositoryPathAllocation, TakesOneOfTheRightSizeForAKeyWhereABufferServes)
{
    const upath root(u"/home/somebody/code/repository");
    ustring buffer(std::strlen(longName), u'x');
    const AllocationCounter counter;
    const upath joined = joinRepositoryPath(root, longName, buffer);
    const std::size_t count = counter.count();
    const std::size_t bytes = counter.bytes();
    EXPECT_EQ(count, 1U);
    EXPECT_EQ(bytes, (joined.string().size() + 1) * sizeof(char16_t));
    EXPECT_EQ(joined.string().size(), root.string().size() + 1 + std::strlen(longName));
}

TEST(JoinRepositoryPathAllocation, TakesNoMoreForANameThatIsNotAscii)
{
    const upath root(u"/home/somebody/code/repository");
    const AllocationCounter counter;
    const upath joined = joinRepositoryPath(root, "\xC3\xBC/folder/of/some/depth/and/a/file.txt");
    EXPECT_LE(counter.count(), 2U);
    EXPECT_EQ(vclink::test::asBytes(joined).find("\xC3\xBC/folder"), root.string().size() + 1);
}

TEST(JoinRepositoryPathAllocation, TakesNoneForATextThatFitsIntoTheString)
{
    const upath root(u"/r");
    const AllocationCounter counter;
    const upath joined = joinRepositoryPath(root, "f");
    EXPECT_EQ(counter.count(), 0U);
    EXPECT_EQ(joined.string(), u"/r/f");
}

} // namespace
