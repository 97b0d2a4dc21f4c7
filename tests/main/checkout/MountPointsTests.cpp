// SPDX-License-Identifier: MIT
#include "main/checkout/mountPoints.hpp"

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <functional>
#include <iostream>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/mount.h>

#include "ObstacleFixture.hpp"
#include "support/text.hpp"

namespace
{

namespace fs = std::filesystem;
using testing::ElementsAre;
using testing::IsEmpty;
using vclink::git::findMountPointsBelow;
using namespace vclink::test;

/// Something of the working tree that is also mounted there, from a copy outside.
class Mount
{
  public:
    Mount(const fs::path &source, fs::path target) : target_(std::move(target))
    {
        fs::copy(target_, source, fs::copy_options::recursive);
        isMounted_ = ::mount(source.c_str(), target_.c_str(), nullptr, MS_BIND, nullptr) == 0;
        if (!isMounted_)
            std::cout << "Nothing can be mounted here (" << std::strerror(errno)
                      << "): only the list of mounts is tested.\n";
    }
    Mount(const Mount &) = delete;
    Mount &operator=(const Mount &) = delete;
    ~Mount()
    {
        if (isMounted_ && ::umount2(target_.c_str(), MNT_DETACH) != 0)
            ADD_FAILURE() << "umount of " << target_;
    }

    bool isMounted() const
    {
        return isMounted_;
    }

  private:
    fs::path target_;
    bool isMounted_ = false;
};

class MountPoints : public ObstacleFixture
{
  protected:
    /// Mounts a name, and expects this refusal of the switch to "topic" and of its merge.
    void expectBothRefused(const std::string &name) const
    {
        const Mount mount(folder() / "mounted", repository_ / name);
        if (!mount.isMounted())
            return;
        const Failure failure = mounted(name);
        expectSwitchRefused(failure);
        expectMergeRefused(failure);
    }
    static Failure mounted(const std::string &name)
    {
        return refusal("'" + name +
                       "' is a mount point, which the checkout would change or remove");
    }
};

TEST_F(MountPoints, AreThoseOfTheListBelowTheRoot)
{
    const std::string list = "1 0 0:1 / / rw - ext4 /dev/a rw\n"
                             "2 1 0:1 /x /root rw shared:1 - ext4 /dev/a rw\n"
                             "3 1 0:1 /x /root/a\\040b\\134 rw - ext4 /dev/a rw\n"
                             "4 1 0:1 /x /rootless rw - ext4 /dev/a rw\n"
                             "5 1 0:1 /x /root/c/d rw - ext4 /dev/a rw";
    EXPECT_THAT(findMountPointsBelow(list, "/root/"), ElementsAre("a b\\", "c/d"));
    EXPECT_THAT(findMountPointsBelow("", "/root/"), IsEmpty());
}

TEST_F(MountPoints, StopACheckoutThatWouldRemoveTheFolder)
{
    diverge(writes("ours", "x"), removes("d/f") + removes("d/g") + removes("other"));
    expectBothRefused("d");
}

TEST_F(MountPoints, StopACheckoutThatWouldChangeTheFile)
{
    theyWrite({"file"});
    expectBothRefused("file");
}

TEST_F(MountPoints, StopARevertOfTheFile)
{
    const Mount mount(folder() / "mounted", repository_ / "file");
    if (!mount.isMounted())
        return;
    repository_.write("file", "edited\n");
    const auto revert = [this]
    { adapter_->revertFiles({asPath((repository_ / "file").string())}); };
    EXPECT_EQ(failureOf(revert), mounted("file"));
    EXPECT_EQ(repository_.read("file"), "edited\n");
}

TEST_F(MountPoints, OfFoldersThatStayAreNoObstacles)
{
    theyWrite({"d/f"});
    const Mount mount(folder() / "mounted", repository_ / "d");
    branches().switchBranch("topic");
    EXPECT_EQ(repository_.read("d/f"), "theirs\n");
    EXPECT_THAT(status(), IsEmpty());
}

} // namespace
