// SPDX-License-Identifier: MIT
#include "main/checkout/WorkingCopy.hpp"

#include <string>

#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/text.hpp"
#include "util/repository/repository.hpp"

namespace
{

namespace git = vclink::git;
using vclink::test::asPath;
using vclink::test::giveToUnprivilegedUser;
using vclink::test::makeFifo;
using vclink::test::runAsUnprivilegedUser;

class WorkingCopies : public vclink::test::ObstacleFixture
{
  protected:
    std::string blockerOf(const std::string &name) const
    {
        const auto repository = git::openRepository(asPath(repository_.path()));
        return git::WorkingCopy(repository.get()).wayTo(name).blocker;
    }
    std::string foreignBelow(const std::string &folder) const
    {
        const auto repository = git::openRepository(asPath(repository_.path()));
        return git::WorkingCopy(repository.get()).foreignBelow(folder);
    }
};

/// It goes before the folder comes.
TEST_F(WorkingCopies, LeadThroughAFileOfHeadThatBecomesAFolder)
{
    EXPECT_EQ(blockerOf("file/a"), "");
    repository_.remove("file");
    repository_.symlink("other", "file");
    EXPECT_EQ(blockerOf("file/a"), "");
}

TEST_F(WorkingCopies, DoNotLeadThroughAFifoInThePlaceOfAFileOfHead)
{
    repository_.remove("file");
    makeFifo(repository_ / "file");
    EXPECT_EQ(blockerOf("file/a"), "file");
    EXPECT_EQ(blockerOf("file/deeper/a"), "file");
}

TEST_F(WorkingCopies, KnowWhatHeadDoesNotHaveInAFolder)
{
    EXPECT_EQ(foreignBelow("d"), "");
    repository_.write("d/deeper/mine", "mine\n");
    EXPECT_EQ(foreignBelow("d"), "d/deeper");
}

TEST_F(WorkingCopies, TakeAFolderThatCannotBeReadForForeign)
{
    repository_.setMode("d", 0);
    giveToUnprivilegedUser(repository_.path());
    EXPECT_EQ(runAsUnprivilegedUser([this] { return foreignBelow("d"); }), "d");
    repository_.setMode("d", 0755);
    EXPECT_EQ(runAsUnprivilegedUser([this] { return foreignBelow("d"); }), "");
}

} // namespace
