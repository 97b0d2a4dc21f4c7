// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <functional>
#include <stdexcept>
#include <string>

#include <git2.h>
#include <gtest/gtest.h>
#include <sys/socket.h>
#include <sys/stat.h>
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

/// Base of the fixtures whose tests put something in the way of a switch or a merge: "main" with
/// "file", "other", "d/f" and "d/g", and a folder outside that nobody may touch.
class ObstacleFixture : public MergeFixture
{
  protected:
    ObstacleFixture()
    {
        repository_.write("d/f", "f\n");
        repository_.write("d/g", "g\n");
        repository_.commitAll("folder");
        for (const auto *name : {"outside/f", "outside/g", "outside/new"})
            repository_.write(std::string("../") + name, "precious\n");
    }

    void expectNothingOutsideChanged() const
    {
        for (const auto *name : {"outside/f", "outside/g", "outside/new"})
            EXPECT_EQ(repository_.read(std::string("../") + name), "precious\n");
    }
    static Failure refusal(const std::string &text)
    {
        return {GIT_ECONFLICT, GIT_ERROR_CHECKOUT, text};
    }
    static Failure inTheWay(const std::string &what)
    {
        return refusal("the " + what + " is in the way of the checkout");
    }
    static Failure staged(const std::string &name)
    {
        return refusal("the staged changes of '" + name + "' would be lost in the checkout");
    }
    static Failure inChangedFolder(const std::string &what)
    {
        return refusal("the " + what + " is in a folder that becomes a file");
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

  private:
    RepositoryState stateWithoutOrigHead() const
    {
        RepositoryState state = stateOf(repository_);
        state.underWay.erase("ORIG_HEAD");
        return state;
    }
};

} // namespace vclink::test
