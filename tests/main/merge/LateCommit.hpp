// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <filesystem>
#include <string>
#include <thread>
#include <utility>

#include <gtest/gtest.h>

#include "support/GitRepository.hpp"

namespace vclink::test
{

/// A `git commit` that has read the index, given up its lock and waits in a hook, until it may go
/// on to move the branch.
class LateCommit
{
  public:
    explicit LateCommit(GitRepository repository) : repository_(std::move(repository))
    {
        // 30 s at most.
        repository_.write(hook_, "#!/bin/sh\n: >\"$0.reached\"\nturn=0\n"
                                 "while [ ! -e \"$0.go\" ] && [ $turn -lt 3000 ]; do\n"
                                 "    sleep 0.01; turn=$((turn + 1))\ndone\n");
        repository_.setMode(hook_, 0755);
        thread_ = std::thread(
            [this]
            {
                isDone_ =
                    repository_.command({"commit", "--quiet", "--allow-empty", "--message", "late"})
                        .run()
                        .succeeded();
            });
        const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(30);
        while (!exists(".reached") && std::chrono::steady_clock::now() < end)
            std::this_thread::sleep_for(std::chrono::milliseconds(2));
        EXPECT_TRUE(exists(".reached"));
    }
    LateCommit(const LateCommit &) = delete;
    LateCommit &operator=(const LateCommit &) = delete;
    ~LateCommit()
    {
        if (thread_.joinable())
            goOn();
    }

    /// @return whether git has committed
    bool goOn()
    {
        repository_.write(hook_ + ".go", "");
        thread_.join();
        return isDone_;
    }

  private:
    bool exists(const std::string &suffix) const
    {
        return std::filesystem::exists(repository_ / (hook_ + suffix));
    }

    const std::string hook_ = ".git/hooks/commit-msg";
    GitRepository repository_;
    bool isDone_ = false;
    std::thread thread_;
};

} // namespace vclink::test
