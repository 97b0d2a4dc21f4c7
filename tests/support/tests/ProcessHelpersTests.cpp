// SPDX-License-Identifier: MIT
#include <chrono>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <functional>
#include <stdexcept>
#include <string>
#include <utility>

#include <fcntl.h>
#include <gtest/gtest-spi.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include "support/Descriptors.hpp"
#include "support/TemporaryFolder.hpp"
#include "support/UnprivilegedUser.hpp"

namespace
{

using namespace vclink::test;
using namespace std::chrono_literals;

TEST(NoDescriptorLeak, FailsTheTestThatLeavesOneOpen)
{
    static int descriptor = -1;
    const auto before = openDescriptors();
    EXPECT_NONFATAL_FAILURE(
        {
            const NoDescriptorLeak check;
            descriptor = ::open("/dev/null", O_RDONLY | O_CLOEXEC);
        },
        "descriptors have changed");
    auto expected = before;
    expected[descriptor] = "/dev/null";
    EXPECT_EQ(openDescriptors(), expected);
    ::close(descriptor);
    EXPECT_EQ(openDescriptors(), before);
}

TEST(UnprivilegedUser, IsRefusedWhatRootIsNot)
{
    const TemporaryFolder folder;
    std::ofstream(folder / "secret") << "text";
    std::filesystem::permissions(folder / "secret", std::filesystem::perms::none);
    const auto answer = runAsUnprivilegedUser(
        [&]() -> std::string { return std::ifstream(folder / "secret") ? "it reads" : ""; });
    EXPECT_EQ(answer, "");
}

TEST(UnprivilegedUser, CannotTakeThePrivilegesBackAndIsInNoGroupOfRoots)
{
    const int groups = runsAsRoot() ? 0 : ::getgroups(0, nullptr);
    const auto answer = runAsUnprivilegedUser(
        [groups]() -> std::string
        {
            if (::getuid() == 0 || ::geteuid() == 0 || ::getegid() == 0)
                return "it is privileged";
            if (::getgroups(0, nullptr) != groups)
                return "it is in a group of root's";
            return ::setuid(0) == 0 || ::setgid(0) == 0 ? "it became privileged again" : "";
        });
    EXPECT_EQ(answer, "");
}

TEST(UnprivilegedUser, MayBeGivenATree)
{
    const TemporaryFolder folder;
    std::filesystem::create_directory(folder / "tree");
    std::ofstream(folder / "tree/file") << "text";
    std::filesystem::create_symlink("/nonexistent", folder / "tree/link");
    giveToUnprivilegedUser(folder / "tree");
    const auto answer = runAsUnprivilegedUser(
        [&]() -> std::string
        {
            std::ofstream stream(folder / "tree/file");
            stream << "more" << std::flush;
            return stream ? "" : "it can't write";
        });
    EXPECT_EQ(answer, "");
}

TEST(UnprivilegedUser, AnswersWithTheTextOfTheActionOrItsExceptionOrHowTheChildEnded)
{
    const NoDescriptorLeak check;
    const std::pair<std::function<std::string()>, std::string> rows[] = {
        {[] { return std::string(200'000, 'x'); }, std::string(200'000, 'x')},
        {[]() -> std::string { throw std::runtime_error("why"); }, "exception: why"},
        {[]() -> std::string { throw 1; }, "exception of a type that has no text"},
        {[]() -> std::string { ::_exit(3); }, "the child process ended early, with status 3"},
        {[] { return std::to_string(::raise(SIGKILL)); }, "the child process ended by signal 9"}};
    for (const auto &[action, answer] : rows)
        EXPECT_EQ(runAsUnprivilegedUser(action), answer);
}

TEST(UnprivilegedUser, WaitsNoLongerThanAllowed)
{
    const auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(runAsUnprivilegedUser(
                  []() -> std::string
                  {
                      ::sleep(30);
                      return "";
                  },
                  200ms),
              "the child process took too long");
    EXPECT_LT(std::chrono::steady_clock::now() - start, 10s);
}

TEST(UnprivilegedUser, LeavesTheParentsExitHandlersAlone)
{
    const TemporaryFolder folder;
    static std::string mark;
    mark = folder / "mark";
    std::atexit([] { std::ofstream{mark} << "x"; });
    std::filesystem::permissions(folder.path(), std::filesystem::perms(01777));
    EXPECT_EQ(runAsUnprivilegedUser([] { return std::string(); }), "");
    EXPECT_FALSE(std::filesystem::exists(folder / "mark"));
}

} // namespace
