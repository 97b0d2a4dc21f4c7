// SPDX-License-Identifier: MIT
#include <algorithm>
#include <chrono>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <functional>
#include <iostream>
#include <optional>
#include <string>
#include <system_error>
#include <thread>
#include <vector>

#include <fcntl.h>
#include <gtest/gtest.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include "ShellFixture.hpp"
#include "differential/Random.hpp"
#include "support/numberFrom.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;
using Clock = std::chrono::steady_clock;
using std::chrono::microseconds;

constexpr int fileCount = 300;

/// A program in a folder, with nothing to read and nobody who reads.
class Program
{
  public:
    Program(const std::vector<std::string> &arguments, const fs::path &folder)
    {
        std::vector<char *> pointers;
        for (const auto &argument : arguments)
            pointers.push_back(const_cast<char *>(argument.c_str()));
        pointers.push_back(nullptr);
        posix_spawn_file_actions_t actions;
        ::posix_spawn_file_actions_init(&actions);
        ::posix_spawn_file_actions_addchdir_np(&actions, folder.c_str());
        for (const int descriptor : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO})
            ::posix_spawn_file_actions_addopen(&actions, descriptor, "/dev/null", O_RDWR, 0);
        const int error =
            ::posix_spawn(&process_, pointers[0], &actions, nullptr, pointers.data(), environ);
        ::posix_spawn_file_actions_destroy(&actions);
        if (error != 0)
            throw std::system_error(error, std::generic_category(), arguments[0]);
    }
    Program(const Program &) = delete;
    Program &operator=(const Program &) = delete;
    ~Program()
    {
        if (!status_)
        {
            ::kill(process_, SIGKILL);
            ::waitpid(process_, nullptr, 0);
        }
    }

    bool hasEnded()
    {
        int status = 0;
        if (!status_ && ::waitpid(process_, &status, WNOHANG) == process_)
            status_ = status;
        return status_.has_value();
    }
    /// @return the status as a shell has it; nothing if it does not end within a minute
    std::optional<int> wait()
    {
        const auto end = Clock::now() + std::chrono::minutes(1);
        while (!hasEnded() && Clock::now() < end)
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
        if (!status_)
            return std::nullopt;
        return WIFSIGNALED(*status_) ? 128 + WTERMSIG(*status_) : WEXITSTATUS(*status_);
    }
    void send(int signal)
    {
        if (!status_)
            ::kill(process_, signal);
    }

  private:
    pid_t process_ = 0;
    std::optional<int> status_;
};

/// Signals at moments that are chosen at random, between the start of the program and its end.
/// VCLINK_SIGNALS says how many of each kind an operation gets, VCLINK_SEED when.
class ShellSignals : public ShellFixture
{
  protected:
    ShellSignals()
    {
        ::setenv("LSAN_OPTIONS", "print_suppressions=0:suppressions=" VCLINK_LEAK_SUPPRESSIONS, 1);
        for (int number = 0; number < fileCount; ++number)
            template_.write(nameOf(number), std::to_string(number) + '\n');
        template_.commitAll("many");
        template_.identify("A", "a@example.org");
    }

    static std::string nameOf(int number)
    {
        return "folder" + std::to_string(number % 10) + "/file" + std::to_string(number);
    }
    /// Commits a change of every third file, so that two sides change different ones.
    void changeThird(int first, const std::string &text)
    {
        for (int number = first; number < fileCount; number += 3)
            template_.write(nameOf(number), text);
        template_.commitAll(text);
    }
    /// "other" and "main", each of which has changed a third of the files.
    void diverge()
    {
        template_.git({"checkout", "--quiet", "-b", "other"});
        changeThird(0, "theirs");
        template_.git({"checkout", "--quiet", "main"});
        changeThird(1, "ours");
    }

    /// Runs the command in copies of the template, and sends each a signal.
    /// @param check looks at what is left, in the working copy
    void expectNothingLeft(const std::vector<std::string> &arguments,
                           const std::function<void(const GitRepository &)> &check)
    {
        std::vector<std::string> command{VCLINK_SHELL};
        command.insert(command.end(), arguments.begin(), arguments.end());
        const microseconds start = measure({VCLINK_SHELL, "version"}) * 3 / 4;
        microseconds whole = measure(command);
        const auto count = static_cast<int>(numberFrom("VCLINK_SIGNALS", 2));
        for (const int signal : {SIGTERM, SIGHUP})
        {
            int inside = 0;
            int sent = 0;
            // What other processes do makes one run last several times as long as the next.
            for (; inside < count && sent < 10 * count && !HasFailure(); ++sent)
            {
                const auto span = std::max(whole - start, microseconds(1000)).count();
                const microseconds delay =
                    start + microseconds(random_.below(static_cast<std::size_t>(span)));
                SCOPED_TRACE(::strsignal(signal) + std::string(" after ") +
                             std::to_string(delay.count()) + " us");
                const Run run = sendAfter(delay, signal, command, check);
                if (run.wasStopped)
                    ++inside;
                else
                    whole = std::min(whole, run.time);
            }
            std::cout << arguments.front() << ": " << inside << " of " << sent
                      << " signals came before the end; a run takes " << whole.count() << " us\n";
            // Else it proves nothing.
            EXPECT_GE(inside, count);
        }
    }

    GitRepository template_ = makeRepository("template");

  private:
    struct Run
    {
        bool wasStopped;
        microseconds time;
    };

    GitRepository makeCopy() const
    {
        const fs::path copy = folder() / "copy";
        fs::remove_all(copy);
        fs::copy(template_.path(), copy, fs::copy_options::recursive);
        return GitRepository(copy);
    }
    microseconds measure(const std::vector<std::string> &command) const
    {
        const GitRepository copy = makeCopy();
        const auto start = Clock::now();
        Program program(command, copy.path());
        EXPECT_EQ(program.wait(), 0);
        return std::chrono::duration_cast<microseconds>(Clock::now() - start);
    }
    Run sendAfter(microseconds delay, int signal, const std::vector<std::string> &command,
                  const std::function<void(const GitRepository &)> &check) const
    {
        const GitRepository copy = makeCopy();
        const auto begin = Clock::now();
        Program program(command, copy.path());
        std::this_thread::sleep_for(delay);
        program.send(signal);
        const std::optional<int> status = program.wait();
        const auto time = std::chrono::duration_cast<microseconds>(Clock::now() - begin);
        EXPECT_TRUE(status == 128 + signal || status == 0) << status.value_or(-1);
        expectNoFileLeft(copy);
        check(copy);
        return {status == 128 + signal, time};
    }
    void expectNoFileLeft(const GitRepository &copy) const
    {
        EXPECT_TRUE(fs::is_empty(environment().temporary()));
        for (const auto &entry : fs::recursive_directory_iterator(copy.path()))
        {
            const std::string name = entry.path().filename().string();
            const bool isLeft = entry.path().extension() == ".lock" || name == "vclink-merge" ||
                                name == "index.vclink" || name == "MERGE_HEAD" ||
                                name.find("tmp_") != std::string::npos ||
                                name.find("_git2_") != std::string::npos;
            EXPECT_FALSE(isLeft) << entry.path();
        }
    }

    Random random_{numberFrom("VCLINK_SEED", 1)};
};

/// Either nothing was done, or all of it.
void expectUnchanged(const GitRepository &copy)
{
    EXPECT_EQ(copy.git({"status", "--porcelain"}), "");
}

void expectOneOf(const std::string &text, const std::vector<std::string> &texts)
{
    EXPECT_NE(std::find(texts.begin(), texts.end(), text), texts.end()) << text;
}

TEST_F(ShellSignals, LeaveNothingOfAMerge)
{
    diverge();
    expectNothingLeft(
        {"merge", "other"},
        [](const GitRepository &copy)
        {
            expectUnchanged(copy);
            expectOneOf(copy.line({"log", "-1", "--format=%s"}), {"ours", "Merge branch 'other'"});
        });
}

TEST_F(ShellSignals, LeaveNothingOfAMergeByCommands)
{
    template_.git({"config", "merge.slow.driver", "sh -c \"sleep 0.02\""});
    template_.write(".gitattributes", "driven* merge=slow\n");
    for (int number = 0; number < 10; ++number)
        template_.write("driven" + std::to_string(number), "base\n");
    template_.commitAll("driven");
    diverge();
    for (const std::string branch : {"other", "main"})
    {
        template_.git({"checkout", "--quiet", branch});
        for (int number = 0; number < 10; ++number)
            template_.write("driven" + std::to_string(number), branch);
        template_.commitAll("driven in " + branch);
    }
    expectNothingLeft({"merge", "other"},
                      [](const GitRepository &copy)
                      {
                          expectUnchanged(copy);
                          expectOneOf(copy.line({"log", "-1", "--format=%s"}),
                                      {"driven in main", "Merge branch 'other'"});
                      });
}

TEST_F(ShellSignals, LeaveNothingOfASwitch)
{
    diverge();
    expectNothingLeft(
        {"switch", "other"},
        [](const GitRepository &copy)
        {
            expectUnchanged(copy);
            expectOneOf(copy.line({"symbolic-ref", "--short", "HEAD"}), {"main", "other"});
        });
}

TEST_F(ShellSignals, LeaveNoHalfClone)
{
    expectNothingLeft(
        {"clone", template_.path(), "clone"},
        [this](const GitRepository &copy)
        {
            const GitRepository clone(copy / "clone");
            if (!std::filesystem::exists(clone.path()))
                return;
            expectUnchanged(clone);
            EXPECT_EQ(clone.line({"rev-parse", "HEAD"}), template_.line({"rev-parse", "HEAD"}));
        });
}

TEST_F(ShellSignals, LeaveNothingOfARevert)
{
    for (int number = 0; number < fileCount; ++number)
        template_.write(nameOf(number), "edited\n");
    expectNothingLeft(
        {"revert", "."},
        [](const GitRepository &copy)
        {
            const auto changes = split(copy.git({"status", "--porcelain"}), '\n');
            expectOneOf(std::to_string(changes.size()), {"0", std::to_string(fileCount)});
        });
}

TEST_F(ShellSignals, LeaveNothingOfACommit)
{
    for (int number = 0; number < fileCount; ++number)
        template_.write(nameOf(number), "edited\n");
    expectNothingLeft({"commit", "-m", "edited"},
                      [](const GitRepository &copy)
                      {
                          const bool isDone = copy.line({"log", "-1", "--format=%s"}) == "edited";
                          const auto changes = split(copy.git({"status", "--porcelain"}), '\n');
                          EXPECT_EQ(changes.size(), isDone ? 0U : std::size_t{fileCount});
                      });
}

} // namespace
} // namespace vclink::test
