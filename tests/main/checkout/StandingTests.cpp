// SPDX-License-Identifier: MIT
#include "main/checkout/standing.hpp"

#include <filesystem>
#include <fstream>

#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"
#include "main/checkout/ClearedWay.hpp"
#include "support/GitFixture.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/text.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

namespace fs = std::filesystem;
namespace git = vclink::git;
using git::Standing;
using namespace vclink::test;

class StandingOfPaths : public GitFixture
{
  protected:
    fs::path operator/(const std::string &name) const
    {
        return folder() / ("place/" + name);
    }
    StandingOfPaths()
    {
        fs::create_directories(*this / "folder/inner");
        std::ofstream(*this / "file") << "x";
        fs::create_symlink("folder", *this / "link");
        fs::create_symlink("nowhere", *this / "dangling");
        makeFifo(*this / "fifo");
        makeSocket(*this / "socket");
    }
    Standing at(const std::string &name) const
    {
        return git::standingAt((*this / name).string());
    }
    bool holdsFiles(const std::string &name) const
    {
        return git::holdsFiles((*this / name).string());
    }

    const LibGit2Session session_{environment()};
};

TEST_F(StandingOfPaths, IsToldWithoutFollowingLinks)
{
    EXPECT_EQ(at("nothing"), Standing::Nothing);
    EXPECT_EQ(at("file/below"), Standing::Nothing);
    EXPECT_EQ(at("file"), Standing::File);
    EXPECT_EQ(at("link"), Standing::Link);
    EXPECT_EQ(at("dangling"), Standing::Link);
    EXPECT_EQ(at("folder"), Standing::Folder);
    EXPECT_EQ(at("fifo"), Standing::Special);
    EXPECT_EQ(at("socket"), Standing::Special);
    EXPECT_EQ(git::standingAt("/dev/null"), Standing::Special);
}

TEST_F(StandingOfPaths, ThatCannotBeExaminedIsAnError)
{
    EXPECT_THROW(at(std::string(300, 'x')), git::LibGit2Exception);
}

TEST_F(StandingOfPaths, OfFoldersIsWhetherTheyHoldFiles)
{
    EXPECT_FALSE(holdsFiles("nothing"));
    EXPECT_FALSE(holdsFiles("file"));
    EXPECT_FALSE(holdsFiles("link"));
    EXPECT_FALSE(holdsFiles("folder"));
    makeFifo(*this / "folder/inner/fifo");
    EXPECT_TRUE(holdsFiles("folder"));
}

TEST_F(StandingOfPaths, OfFoldersThatCannotBeReadIsThatTheyHoldFiles)
{
    fs::permissions(*this / "folder/inner", fs::perms::none);
    giveToUnprivilegedUser(folder().path());
    const auto answer = [this] { return holdsFiles("folder") ? "files" : "none"; };
    EXPECT_EQ(runAsUnprivilegedUser(answer), "files");
    fs::permissions(*this / "folder/inner", fs::perms::owner_all);
    EXPECT_EQ(runAsUnprivilegedUser(answer), "none");
}

TEST_F(StandingOfPaths, OfLinksIsWhatTheyLeadTo)
{
    EXPECT_EQ(git::readLink((*this / "dangling").string()), "nowhere");
    EXPECT_EQ(git::readLink((*this / "file").string()), "");
}

/// What is removed before a checkout, and put back after one that failed.
class ClearedWay : public StandingOfPaths
{
  protected:
    static void removeAll(git::ClearedWay &way, const fs::path &place)
    {
        for (const auto *name : {"link", "dangling", "fifo", "socket", "folder/inner"})
            way.remove((place / name).string());
    }
};

TEST_F(ClearedWay, ComesBackAtItsEnd)
{
    {
        git::ClearedWay way;
        removeAll(way, *this / "");
        for (const auto *name : {"link", "dangling", "fifo", "socket", "folder/inner"})
            EXPECT_EQ(at(name), Standing::Nothing) << name;
    }
    EXPECT_EQ(fs::read_symlink(*this / "link"), "folder");
    EXPECT_EQ(fs::read_symlink(*this / "dangling"), "nowhere");
    EXPECT_EQ(fs::status(*this / "fifo").permissions(), fs::perms(0644));
    EXPECT_EQ(at("fifo"), Standing::Special);
    EXPECT_EQ(at("folder/inner"), Standing::Folder);
    EXPECT_EQ(at("socket"), Standing::Nothing);
}

TEST_F(ClearedWay, LeavesWhatHasComeInItsPlace)
{
    {
        git::ClearedWay way;
        removeAll(way, *this / "");
        for (const auto *name : {"link", "dangling", "fifo", "folder/inner"})
            std::ofstream(*this / name) << "new";
    }
    for (const auto *name : {"link", "dangling", "fifo", "folder/inner"})
        EXPECT_EQ(at(name), Standing::File) << name;
}

TEST_F(ClearedWay, NeverRemovesFilesAndFoldersWithContent)
{
    git::ClearedWay way;
    way.remove((*this / "file").string());
    way.remove((*this / "folder").string());
    way.remove((*this / "nothing").string());
    EXPECT_EQ(at("file"), Standing::File);
    EXPECT_EQ(at("folder"), Standing::Folder);
}

TEST_F(ClearedWay, DoesNotMakeAFolderThatItHasNotRemoved)
{
    {
        git::ClearedWay way;
        way.remove((*this / "folder").string());
        fs::remove_all(*this / "folder");
    }
    EXPECT_EQ(at("folder"), Standing::Nothing);
}

TEST_F(ClearedWay, FailsAtWhatItCannotRemove)
{
    fs::permissions(*this / "", fs::perms::owner_read | fs::perms::owner_exec);
    giveToUnprivilegedUser(folder().path());
    const std::string outcome = runAsUnprivilegedUser(
        [this]
        {
            git::ClearedWay way;
            return failureOf([&] { way.remove((*this / "link").string()); }).text;
        });
    fs::permissions(*this / "", fs::perms::owner_all);
    EXPECT_EQ(outcome, "could not remove '" + (*this / "link").string() + "': Permission denied");
    EXPECT_EQ(at("link"), Standing::Link);
}

} // namespace
