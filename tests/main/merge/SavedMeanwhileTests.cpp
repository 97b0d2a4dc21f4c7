// SPDX-License-Identifier: MIT
// What becomes of a file that is saved while a merge commits itself, in the second in which the
// merge has written it: git compares no fractions of a second.
#include <ctime>
#include <string>
#include <utility>

#include <fcntl.h>
#include <git2.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include "main/branches/BranchCallsFixture.hpp"
#include "support/libgit2/LibGit2Recorder.hpp"

namespace
{

using namespace vclink::test;

class SavedMeanwhile : public BranchCallsFixture
{
  protected:
    SavedMeanwhile()
    {
        // The time of a file's inode cannot be set.
        repository_.git({"config", "core.trustctime", "false"});
        makeBranch("topic", writes("file", "theirs\n"));
        repository_.commitAll(writes("ours", "x"), "on main");
    }
    /// Has the merge's index written some time after the file, as it is where there are many:
    /// libgit2 takes a file of the same moment for changed.
    void letTimePass(LibGit2Recorder &calls) const
    {
        calls.on<git_reference_dwim>(
            [this](git_reference **, git_repository *, const char *name)
            {
                struct stat status = {};
                if (name == std::string("topic") &&
                    ::stat((repository_ / "file").c_str(), &status) == 0)
                    setTime(".git/index", {status.st_mtim.tv_sec, 999'999'999});
            });
    }
    /// With as many bytes, in the same second as the merge, and goes on in the next one.
    void save() const
    {
        struct stat status = {};
        ASSERT_EQ(::stat((repository_ / "file").c_str(), &status), 0);
        repository_.write("file", "edited\n");
        const long fraction = status.st_mtim.tv_nsec == 0 ? 1 : status.st_mtim.tv_nsec - 1;
        setTime("file", {status.st_mtim.tv_sec, fraction});
        while (std::time(nullptr) <= status.st_mtim.tv_sec)
        {
            const timespec pause{0, 10'000'000};
            ::nanosleep(&pause, nullptr);
        }
    }

  private:
    void setTime(const char *name, timespec time) const
    {
        const timespec times[] = {time, time};
        ASSERT_EQ(::utimensat(AT_FDCWD, (repository_ / name).c_str(), times, 0), 0);
    }
};

TEST_F(SavedMeanwhile, IsInTheCommitIfItWasThereBefore)
{
    LibGit2Recorder calls;
    letTimePass(calls);
    calls.on<git_index_update_all>([this](auto...) { save(); });
    branches().merge("topic");
    EXPECT_EQ(repository_.git({"show", "main:file"}), "edited\n");
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), "");
}

TEST_F(SavedMeanwhile, IsAChangeToGitIfItCameAfterTheRefresh)
{
    LibGit2Recorder calls;
    letTimePass(calls);
    bool isRefreshed = false;
    calls.on<git_index_update_all>([&](auto...) { isRefreshed = true; });
    calls.on<git_index_entrycount>(
        [&](auto...)
        {
            if (std::exchange(isRefreshed, false))
                save();
        });
    branches().merge("topic");
    EXPECT_EQ(repository_.git({"show", "main:file"}), "theirs\n");
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), " M file\n");
}

} // namespace
