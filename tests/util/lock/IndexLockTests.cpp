// SPDX-License-Identifier: MIT
#include <chrono>
#include <filesystem>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include <fcntl.h>
#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include "support/Descriptors.hpp"
#include "support/Failure.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/text.hpp"
#include "util/lock/IndexLock.hpp"
#include "util/repository/repository.hpp"

namespace
{

namespace fs = std::filesystem;
namespace git = vclink::git;
using git::IndexLock;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::UnorderedElementsAre;
using namespace vclink::test;

struct stat statusOf(const fs::path &file)
{
    struct stat status = {};
    if (::lstat(file.c_str(), &status) != 0)
        throw std::runtime_error("no " + file.string());
    return status;
}

class IndexLockTest : public GitFixture
{
  protected:
    IndexLockTest()
    {
        repository_.write("file", "one\n");
        repository_.add();
        repository_.write("new", "two\n");
    }

    static git::OwnedHandle<git_repository> open(const GitRepository &repository)
    {
        return git::openRepository(asPath(repository.path()));
    }
    static Failure failureToLock(git_repository *repository)
    {
        return failureOf([&] { static_cast<void>(IndexLock(repository)); });
    }
    /// Puts the file into the repository's index, and writes that.
    static void stage(git_repository *repository, const std::string &name)
    {
        const auto index = git::getRepositoryIndex(repository);
        ASSERT_EQ(git_index_add_bypath(index.get(), name.c_str()), 0);
        git::writeIndex(index.get());
    }
    static void stageLocked(git_repository *repository, const std::string &name)
    {
        const IndexLock lock(repository);
        stage(repository, name);
    }
    /// The files in a folder whose names begin with "index".
    static std::vector<std::string> indexFilesIn(const fs::path &folder)
    {
        std::vector<std::string> names;
        for (const auto &entry : fs::directory_iterator(folder))
        {
            if (entry.path().filename().string().rfind("index", 0) == 0)
                names.push_back(entry.path().filename());
        }
        return names;
    }
    std::vector<std::string> indexFiles() const
    {
        return indexFilesIn(repository_ / ".git");
    }
    std::string staged() const
    {
        return repository_.git({"ls-files"});
    }

    LibGit2Session session_{environment()};
    GitRepository repository_ = makeRepository();
};

TEST_F(IndexLockTest, LeavesAnIndexThatIsNotWrittenAsItIs)
{
    const auto before = statusOf(repository_ / ".git/index");
    {
        const auto opened = open(repository_);
        IndexLock lock(opened.get());
        EXPECT_EQ(git_index_entrycount(git::getRepositoryIndex(opened.get()).get()), 1U);
        lock.publish();
    }
    const auto after = statusOf(repository_ / ".git/index");
    EXPECT_EQ(after.st_ino, before.st_ino);
    EXPECT_EQ(after.st_ctim.tv_nsec, before.st_ctim.tv_nsec);
    EXPECT_THAT(indexFiles(), ElementsAre("index"));
}

TEST_F(IndexLockTest, KeepsGitOutUntilItsEnd)
{
    const auto opened = open(repository_);
    {
        IndexLock lock(opened.get());
        EXPECT_THAT(repository_.tryGit({"add", "new"}).errors, HasSubstr("index.lock"));
        stage(opened.get(), "new");
        EXPECT_EQ(staged(), "file\n");
        lock.publish();
        EXPECT_EQ(staged(), "file\nnew\n");
        EXPECT_THAT(repository_.tryGit({"add", "new"}).errors, HasSubstr("index.lock"));
    }
    EXPECT_TRUE(repository_.tryGit({"add", "new"}).succeeded());
    EXPECT_THAT(indexFiles(), ElementsAre("index"));
}

TEST_F(IndexLockTest, LetsGitInWhenItIsReleasedAndNoOtherLockOfThisProcessBefore)
{
    const auto opened = open(repository_);
    IndexLock lock(opened.get());
    stage(opened.get(), "new");
    lock.release();
    EXPECT_EQ(staged(), "file\nnew\n");
    EXPECT_THAT(indexFiles(), ElementsAre("index"));
    const auto other = open(repository_);
    const IndexLock next(other.get());
    EXPECT_THAT(indexFiles(), UnorderedElementsAre("index", "index.lock", "index.vclink"));
    EXPECT_EQ(failureToLock(opened.get()).code, GIT_ELOCKED);
    EXPECT_THAT(indexFiles(), UnorderedElementsAre("index", "index.lock", "index.vclink"));
}

TEST_F(IndexLockTest, PutsInPlaceWhatWasWrittenBeforeAFailure)
{
    const auto opened = open(repository_);
    const auto fail = [&]
    {
        const IndexLock lock(opened.get());
        stage(opened.get(), "new");
        throw std::runtime_error("later");
    };
    EXPECT_THROW(fail(), std::runtime_error);
    EXPECT_EQ(staged(), "file\nnew\n");
    EXPECT_THAT(indexFiles(), ElementsAre("index"));
}

TEST_F(IndexLockTest, NoticesAnyNumberOfWrites)
{
    const auto opened = open(repository_);
    for (int writes = 1; writes <= 4; ++writes)
    {
        const std::string name = "new" + std::to_string(writes);
        repository_.write(name, "x");
        IndexLock lock(opened.get());
        for (int i = 1; i < writes; ++i)
            git::writeIndex(git::getRepositoryIndex(opened.get()).get());
        stage(opened.get(), name);
        lock.release();
        EXPECT_THAT(staged(), HasSubstr(name));
    }
}

TEST_F(IndexLockTest, IsRefusedWhereAnotherStands)
{
    repository_.write(".git/index.lock", "of another process");
    const auto opened = open(repository_);
    EXPECT_EQ(failureToLock(opened.get()),
              (Failure{GIT_ELOCKED, GIT_ERROR_INDEX,
                       "the index is locked by '" + (repository_ / ".git/index.lock").string() +
                           "'; this might be due to a concurrent or crashed process"}));
    EXPECT_EQ(repository_.read(".git/index.lock"), "of another process");
    EXPECT_THAT(indexFiles(), UnorderedElementsAre("index", "index.lock"));
}

TEST_F(IndexLockTest, CopiesAnIndexOfAnySizeWithTheSecondOfItsTime)
{
    for (int i = 0; i < 3'000; ++i)
        repository_.write("many/of them with a long name, number " + std::to_string(i), "");
    repository_.add();
    ASSERT_GT(fs::file_size(repository_ / ".git/index"), 200'000U);
    const timespec times[] = {{1'000'000'000, 1}, {1'234'567'890, 987'654'321}};
    ASSERT_EQ(::utimensat(AT_FDCWD, (repository_ / ".git/index").c_str(), times, 0), 0);
    const auto opened = open(repository_);
    const IndexLock lock(opened.get());
    EXPECT_EQ(repository_.read(".git/index.vclink"), repository_.read(".git/index"));
    const auto copy = statusOf(repository_ / ".git/index.vclink");
    EXPECT_EQ(copy.st_mtim.tv_sec, 1'234'567'890);
    EXPECT_EQ(copy.st_mtim.tv_nsec, 0);
}

/// An entry of the same size, changed within the tick of the clock in which it was staged.
TEST_F(IndexLockTest, LeavesNoChangeUnnoticed)
{
    const auto opened = open(repository_);
    for (int i = 0; i < 10; ++i)
    {
        repository_.write("file", "aaa\n");
        {
            IndexLock lock(opened.get());
            stage(opened.get(), "file");
            lock.publish();
        }
        repository_.write("file", "bbb\n");
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
        stageLocked(opened.get(), "new");
        EXPECT_EQ(repository_.git({"diff", "--name-only"}), "file\n");
    }
}

/// libgit2 compares fractions of a second, git does not.
TEST_F(IndexLockTest, LeavesNoChangeOfTheSameSecondUnnoticed)
{
    const auto setTime = [this](const char *name, long fraction)
    {
        const timespec times[] = {{1'000'000'000, 0}, {1'000'000'000, fraction}};
        ASSERT_EQ(::utimensat(AT_FDCWD, (repository_ / name).c_str(), times, 0), 0);
    };
    // It could not be set.
    repository_.git({"config", "core.trustctime", "false"});
    const auto opened = open(repository_);
    repository_.write("file", "aaa\n");
    setTime("file", 100);
    stageLocked(opened.get(), "file");
    setTime(".git/index", 300);
    repository_.write("file", "bbb\n");
    setTime("file", 500);
    stageLocked(opened.get(), "new");
    EXPECT_EQ(repository_.git({"diff", "--name-only"}), "file\n");
}

TEST_F(IndexLockTest, MakesTheFirstIndexOfARepository)
{
    const auto fresh = makeRepository("fresh");
    fresh.write("file", "x");
    const auto opened = open(fresh);
    {
        IndexLock lock(opened.get());
        EXPECT_THAT(indexFilesIn(fresh / ".git"), ElementsAre("index.lock"));
        lock.publish();
    }
    EXPECT_THAT(indexFilesIn(fresh / ".git"), ElementsAre());
    stageLocked(opened.get(), "file");
    EXPECT_THAT(indexFilesIn(fresh / ".git"), ElementsAre("index"));
    EXPECT_EQ(fresh.git({"ls-files"}), "file\n");
}

TEST_F(IndexLockTest, TakesTheLockOfALinkedWorkingTree)
{
    repository_.commit("first");
    repository_.git({"worktree", "add", "--quiet", (folder() / "linked").string()});
    const GitRepository linked(folder() / "linked");
    linked.write("linked", "x");
    const auto opened = open(linked);
    IndexLock lock(opened.get());
    EXPECT_THAT(indexFiles(), ElementsAre("index"));
    EXPECT_THAT(linked.tryGit({"add", "linked"}).errors, HasSubstr("index.lock"));
    EXPECT_TRUE(repository_.tryGit({"add", "new"}).succeeded());
    stage(opened.get(), "linked");
    lock.publish();
    EXPECT_EQ(linked.git({"ls-files"}), "file\nlinked\n");
}

TEST_F(IndexLockTest, FollowsALinkToTheIndexAsGitDoes)
{
    fs::create_directory(folder() / "elsewhere");
    fs::rename(repository_ / ".git/index", folder() / "elsewhere/an index");
    repository_.symlink("../../elsewhere/an index", ".git/index");
    const auto opened = open(repository_);
    {
        IndexLock lock(opened.get());
        EXPECT_TRUE(fs::exists(folder() / "elsewhere/an index.lock"));
        EXPECT_THAT(repository_.tryGit({"add", "new"}).errors, HasSubstr("File exists"));
        stage(opened.get(), "new");
        lock.publish();
    }
    EXPECT_TRUE(fs::is_symlink(repository_ / ".git/index"));
    EXPECT_EQ(staged(), "file\nnew\n");
    EXPECT_THAT(indexFiles(), ElementsAre("index"));
    fs::remove(folder() / "elsewhere/an index");
    {
        const auto again = open(repository_);
        const IndexLock lock(again.get());
        EXPECT_TRUE(fs::exists(folder() / "elsewhere/an index.lock"));
    }
    EXPECT_TRUE(fs::is_empty(folder() / "elsewhere"));
}

TEST_F(IndexLockTest, EndsAtALinkThatLeadsToItself)
{
    const auto opened = open(repository_);
    repository_.remove(".git/index");
    repository_.symlink("index", ".git/index");
    EXPECT_THAT(failureToLock(opened.get()).text, HasSubstr("Too many levels of symbolic links"));
    EXPECT_THAT(indexFiles(), ElementsAre("index"));
}

TEST_F(IndexLockTest, TakesNoNoticeOfWhatAKilledProcessLeft)
{
    repository_.write(".git/index.vclink", "half of an index");
    repository_.write(".git/index.vclink.lock", "half");
    const auto opened = open(repository_);
    stageLocked(opened.get(), "new");
    EXPECT_EQ(staged(), "file\nnew\n");
    EXPECT_THAT(indexFiles(), ElementsAre("index"));
    repository_.write(".git/index.vclink", "half of an index");
    repository_.remove(".git/index");
    const auto fresh = open(repository_);
    EXPECT_NO_THROW(static_cast<void>(IndexLock(fresh.get())));
    EXPECT_THAT(indexFiles(), ElementsAre());
}

TEST_F(IndexLockTest, IsGivenUpWhereTheIndexCannotBeRead)
{
    const std::string broken = "this is no index, and long enough to be told from an empty one";
    repository_.write(".git/index", broken);
    const auto opened = open(repository_);
    EXPECT_EQ(failureToLock(opened.get()).errorClass, GIT_ERROR_INDEX);
    EXPECT_THAT(indexFiles(), ElementsAre("index"));
    EXPECT_EQ(repository_.read(".git/index"), broken);
}

TEST_F(IndexLockTest, IsGivenUpWhereTheIndexMayNotBeRead)
{
    repository_.setMode(".git/index", 0000);
    giveToUnprivilegedUser(folder().path());
    const std::string text = runAsUnprivilegedUser(
        [&]
        {
            const auto opened = open(repository_);
            return failureToLock(opened.get()).text;
        });
    EXPECT_EQ(text, "failed to read index: '" + (repository_ / ".git/index").string() +
                        "': Permission denied");
    EXPECT_THAT(indexFiles(), ElementsAre("index"));
}

TEST_F(IndexLockTest, KeepsLibGit2sSettingsOfTheIndex)
{
    repository_.git({"config", "core.ignoreCase", "true"});
    repository_.git({"config", "core.fileMode", "false"});
    const auto plain = open(repository_);
    const auto expected = git_index_caps(git::getRepositoryIndex(plain.get()).get());
    const auto opened = open(repository_);
    const IndexLock lock(opened.get());
    const auto index = git::getRepositoryIndex(opened.get());
    EXPECT_EQ(git_index_caps(index.get()), expected);
    EXPECT_EQ(git_index_owner(index.get()), opened.get());
    EXPECT_NE(expected, 0);
}

TEST_F(IndexLockTest, LeavesTheModeThatLibGit2Gives)
{
    repository_.setMode(".git/index", 0600);
    const mode_t mask = ::umask(0027);
    {
        const auto opened = open(repository_);
        IndexLock lock(opened.get());
        stage(opened.get(), "new");
    }
    ::umask(mask);
    EXPECT_EQ(statusOf(repository_ / ".git/index").st_mode & 0777U, 0640U);
}

TEST_F(IndexLockTest, LeavesNoDescriptorOpenAndHandsNoneOn)
{
    const auto opened = open(repository_);
    const NoDescriptorLeak noLeak;
    {
        const IndexLock lock(opened.get());
        for (const auto &[descriptor, file] : openDescriptors())
        {
            if (fs::path(file).filename() == "index.vclink")
            {
                EXPECT_NE(::fcntl(descriptor, F_GETFD) & FD_CLOEXEC, 0);
            }
        }
    }
    repository_.write(".git/index", "no index");
    failureToLock(opened.get());
}

} // namespace
