// SPDX-License-Identifier: MIT
#include <algorithm>
#include <cerrno>
#include <cstdint>
#include <cstring>
#include <fstream>
#include <iostream>
#include <sstream>
#include <string>
#include <utility>

#include <gtest/gtest.h>
#include <sys/mount.h>

#include "DiskFixture.hpp"
#include "support/strings.hpp"

namespace
{

namespace fs = std::filesystem;
using vclink::test::Action;
using vclink::test::Operation;
using vclink::test::startsWith;

constexpr std::uintmax_t page = 4096;

/// A file system of 2 MiB in memory, on an empty folder.
class SmallDisk
{
  public:
    explicit SmallDisk(fs::path folder) : folder_(std::move(folder))
    {
        fs::create_directories(folder_);
        isMounted_ = ::mount("tmpfs", folder_.c_str(), "tmpfs", 0, "size=2m,mode=0777") == 0;
        if (!isMounted_)
            std::cout << "No small file system here (" << std::strerror(errno)
                      << "): the limit of a file's size stands for it.\n";
    }
    SmallDisk(const SmallDisk &) = delete;
    SmallDisk &operator=(const SmallDisk &) = delete;
    ~SmallDisk()
    {
        if (isMounted_ && ::umount2(folder_.c_str(), MNT_DETACH) != 0)
            ADD_FAILURE() << "umount of " << folder_;
    }

    bool isMounted() const noexcept
    {
        return isMounted_;
    }
    /// Leaves this many bytes free.
    void fill(std::uintmax_t rest) const
    {
        const auto free = fs::space(folder_).available;
        if (free > rest)
            std::ofstream(filler()) << std::string(free - rest, 'x');
    }
    void empty() const
    {
        fs::remove(filler());
    }

  private:
    fs::path filler() const
    {
        return folder_ / "filler";
    }

    fs::path folder_;
    bool isMounted_ = false;
};

/// The remote-tracking branches of the first gist, and the rest of the second.
std::string withTracking(const std::string &before, const std::string &after)
{
    const std::string folder = "refs/remotes/";
    std::istringstream lines(after);
    std::string mixed;
    for (std::string line; std::getline(lines, line);)
    {
        const auto name = line.substr(0, line.find(' ') + 1);
        const auto found = before.find('\n' + name);
        if (!startsWith(line, folder))
            mixed += line + '\n';
        else if (found != std::string::npos)
            mixed += before.substr(found + 1, before.find('\n', found + 1) - found);
    }
    return mixed;
}

class FullDisk : public vclink::test::DiskFixture
{
  protected:
    const SmallDisk disk_{folder() / "disk"};
};

TEST_P(FullDisk, FailsWithATypeAndLosesNothing)
{
    if (!disk_.isMounted())
        return;
    prepare(folder() / "disk/trial");
    // libgit2 keeps to itself that a push could not move the remote-tracking branch.
    const std::string untracked = withTracking(gistBefore(), trial().normalGist());
    for (const std::uintmax_t pages : {0U, 1U, 2U, 4U})
    {
        SCOPED_TRACE(std::to_string(pages) + " pages free");
        tryOnce(
            [this, pages](const Action &action)
            {
                disk_.fill(pages * page);
                std::string outcome = runInChild(action);
                disk_.empty();
                return outcome;
            },
            {untracked});
    }
}

/// The user's configuration is elsewhere.
std::vector<Operation> operationsOnTheDisk()
{
    std::vector<Operation> operations = vclink::test::operationsThatWrite();
    operations.erase(std::remove_if(operations.begin(), operations.end(),
                                    [](const Operation &operation)
                                    { return operation.name.compare(0, 5, "write") == 0; }),
                     operations.end());
    return operations;
}

std::vector<Operation> mergeByTool()
{
    const std::vector<Operation> operations = vclink::test::operationsThatWrite();
    return {*std::find_if(operations.begin(), operations.end(),
                          [](const Operation &operation)
                          { return operation.name == "mergeByTool"; })};
}

INSTANTIATE_TEST_SUITE_P(Of, FullDisk, testing::ValuesIn(operationsOnTheDisk()),
                         vclink::test::nameOfOperation);

/// The merge tool's temporary files are elsewhere.
class FullTemporaryFolder : public vclink::test::DiskFixture
{
  protected:
    const SmallDisk disk_{environment().temporary()};
};

/// Intentionally nothing says that a temporary file is incomplete: the tool gets what was written.
/// Both sides are in the history.
TEST_P(FullTemporaryFolder, GivesTheToolEmptyFiles)
{
    if (!disk_.isMounted())
        return;
    prepare(folder() / "trial");
    const Action action = trial().begin();
    disk_.fill(0);
    const std::string outcome = runInChild(action);
    disk_.empty();
    EXPECT_EQ(outcome, "done: ");
    EXPECT_EQ(trial().repository().git({"show", "HEAD:file"}), "");
    EXPECT_EQ(trial().repository().git({"show", "HEAD^1:file"}), "ours\n");
    EXPECT_EQ(trial().repository().git({"show", "HEAD^2:file"}), "theirs\n");
    trial().expectSound();
}

INSTANTIATE_TEST_SUITE_P(Of, FullTemporaryFolder, testing::ValuesIn(mergeByTool()),
                         vclink::test::nameOfOperation);

} // namespace
