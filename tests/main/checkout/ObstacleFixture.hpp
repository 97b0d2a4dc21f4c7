// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <cstddef>
#include <ctime>
#include <filesystem>
#include <functional>
#include <stdexcept>
#include <string>
#include <vector>

#include <fcntl.h>
#include <git2.h>
#include <gtest/gtest.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/sysmacros.h>
#include <sys/un.h>
#include <unistd.h>

#include "main/merge/MergeFixture.hpp"
#include "support/UnprivilegedUser.hpp"

namespace vclink::test
{

/// Makes a FIFO, and the folders above it.
inline void makeFifo(const std::filesystem::path &path)
{
    std::filesystem::create_directories(path.parent_path());
    ASSERT_EQ(::mkfifo(path.c_str(), 0644), 0);
}

/// Leaves a socket that nobody listens at.
inline void makeSocket(const std::filesystem::path &path)
{
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    const std::string name = path.string();
    ASSERT_LT(name.size(), sizeof(address.sun_path));
    name.copy(address.sun_path, name.size());
    const int descriptor = ::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0);
    EXPECT_EQ(::bind(descriptor, reinterpret_cast<const sockaddr *>(&address), sizeof(address)), 0);
    ::close(descriptor);
}

inline Change makesFifo(const std::string &name)
{
    return [=](const GitRepository &copy) { makeFifo(copy / name); };
}

/// A character device. Only root makes one with a number, such as that of /dev/null; some file
/// systems have none without.
inline Change makesDevice(const std::string &name)
{
    return [=](const GitRepository &copy)
    {
        const auto make = [&](dev_t number)
        { return ::mknod((copy / name).c_str(), S_IFCHR | 0644, number) == 0; };
        ASSERT_TRUE(make(::makedev(1, 3)) || make(0));
    };
}

inline Change makesSocket(const std::string &name)
{
    return [=](const GitRepository &copy) { makeSocket(copy / name); };
}

/// As a program does that restores times: the content differs, size and time do not.
inline Change writesAtTheSameTime(const std::string &name, const std::string &bytes)
{
    return [=](const GitRepository &copy)
    {
        struct stat before = {};
        ASSERT_EQ(::stat((copy / name).c_str(), &before), 0);
        ASSERT_EQ(static_cast<std::size_t>(before.st_size), bytes.size());
        copy.write(name, bytes);
        const std::array<timespec, 2> times{before.st_atim, before.st_mtim};
        ASSERT_EQ(::utimensat(AT_FDCWD, (copy / name).c_str(), times.data(), 0), 0);
    };
}

inline Change setsAnOldTime(const std::string &name, std::time_t time = 1'000'000'000)
{
    return [=](const GitRepository &copy)
    {
        const std::array<timespec, 2> times{timespec{time, 0}, timespec{time, 0}};
        ASSERT_EQ(::utimensat(AT_FDCWD, (copy / name).c_str(), times.data(), 0), 0);
    };
}

/// Patterns of ignored files, in place of any others.
inline Change ignores(const std::string &patterns)
{
    return writes(".git/info/exclude", patterns + '\n');
}

inline Failure refusal(const std::string &text)
{
    return {GIT_ECONFLICT, GIT_ERROR_CHECKOUT, text};
}

inline Failure inTheWay(const std::string &what)
{
    return refusal("the " + what + " is in the way of the checkout");
}

inline Failure staged(const std::string &name)
{
    return refusal("the staged changes of '" + name + "' would be lost in the checkout");
}

inline Failure inChangedFolder(const std::string &what)
{
    return refusal("the " + what + " is in a folder that becomes a file");
}

/// Something of the user's, and the refusal to go on beside it, which names it.
struct Obstacle
{
    Change put;
    Failure refused;
};

/// Base of the fixtures whose tests put something in the way of a switch or a merge: "main" with
/// "file", "other", "d/f" and "d/g", and a folder outside that nobody may touch.
class ObstacleFixture : public MergeFixture
{
  protected:
    ObstacleFixture()
    {
        repository_.commitAll(writes("d/f", "f\n") + writes("d/g", "g\n"), "folder");
        writesEach({"f", "g", "new"}, "precious\n")(outside_);
        outsideAtFirst_ = workingTreeOf(outside_);
    }

    /// Has these written by the other side, "topic", and something else by ours.
    void theyWrite(const std::vector<std::string> &names)
    {
        diverge(writes("ours", "x"), writesEach(names, "theirs\n"));
    }
    void ignore(const std::string &patterns) const
    {
        ignores(patterns)(repository_);
    }
    void expectNothingOutsideChanged() const
    {
        EXPECT_EQ(workingTreeOf(outside_), outsideAtFirst_);
    }
    /// Expects that `action` changes nothing but ORIG_HEAD, not even the index file's time.
    void expectNothingChanges(const std::function<void()> &action) const
    {
        const RepositoryState before = stateWithoutOrigHead();
        const FileStamp index = indexStampOf(repository_);
        action();
        EXPECT_EQ(stateWithoutOrigHead(), before);
        EXPECT_EQ(indexStampOf(repository_), index);
        EXPECT_EQ(branches().getRepositoryState(), "Normal");
        expectNothingOutsideChanged();
    }
    void expectSwitchRefused(const Failure &failure, const std::string &branch = "topic") const
    {
        expectNothingChanges(
            [&] { EXPECT_EQ(failureOf([&] { branches().switchBranch(branch); }), failure); });
    }
    void expectMergeRefused(const Failure &failure) const
    {
        expectNothingChanges([&] { EXPECT_EQ(failureOfMerge("topic"), textOf(failure)); });
    }

    void expectSwitches() const
    {
        branches().switchBranch("topic");
        EXPECT_EQ(currentBranch(), "refs/heads/topic");
    }
    /// Expects this refusal of the merge.
    virtual void expectRefused(const Failure &failure) const
    {
        expectMergeRefused(failure);
    }
    /// Puts each obstacle, expects its refusal, and puts back what was there.
    void expectEachRefused(const std::vector<Obstacle> &obstacles) const
    {
        for (const auto &[put, refused] : obstacles)
        {
            SCOPED_TRACE(refused.text);
            put(repository_);
            expectRefused(refused);
            const auto name = refused.text.find('\'') + 1;
            const auto end = refused.text.find('\'', name);
            std::filesystem::remove_all(repository_ / refused.text.substr(name, end - name));
            repository_.git({"reset", "--quiet", "--hard"});
        }
    }

    /// Gives the working copy to the unprivileged user, runs `action` as that user while a name has
    /// these permissions, expects that nothing changes, and returns what `action` returns.
    std::string runUnprivileged(const std::string &name, mode_t mode,
                                const std::function<std::string()> &action) const
    {
        repository_.git({"config", "--global", "safe.directory", "*"});
        giveToUnprivilegedUser(folder().path());
        const NothingChanges nothing(repository_);
        struct stat before = {};
        EXPECT_EQ(::stat((repository_ / name).c_str(), &before), 0);
        repository_.setMode(name, mode);
        std::string result = runAsUnprivilegedUser(action);
        repository_.setMode(name, before.st_mode & ALLPERMS);
        return result;
    }

    const GitRepository outside_{folder() / "outside"};

  private:
    RepositoryState stateWithoutOrigHead() const
    {
        RepositoryState state = stateOf(repository_);
        state.underWay.erase("ORIG_HEAD");
        return state;
    }

    RepositoryState::Entries outsideAtFirst_;
};

} // namespace vclink::test
