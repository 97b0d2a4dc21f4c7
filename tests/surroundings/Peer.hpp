// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <string>
#include <thread>
#include <vector>

#include "support/GitRepository.hpp"

namespace vclink::test
{

/// git at work on a working copy, in processes of its own, while the library is.
class Peer
{
  public:
    /// The names of what it can do again and again.
    static const std::vector<std::string> &trades();

    /// Begins.
    Peer(const GitRepository &copy, std::string trade);
    Peer(const Peer &) = delete;
    Peer &operator=(const Peer &) = delete;
    ~Peer();

    /// Lets it finish what it is at.
    void stop();

    /// How many of git's commands have succeeded, and failed. After stop().
    int succeeded() const noexcept
    {
        return succeeded_;
    }
    int failed() const noexcept
    {
        return failed_;
    }
    /// The ids of the files that git says it has added or committed. After stop().
    const std::vector<std::string> &acknowledged() const noexcept
    {
        return acknowledged_;
    }

  private:
    void work();
    void addAndCommit(int turn);
    bool run(const std::vector<std::string> &arguments);

    GitRepository copy_;
    std::string trade_;
    std::atomic<bool> isOver_{false};
    int succeeded_ = 0;
    int failed_ = 0;
    std::vector<std::string> acknowledged_;
    std::thread thread_;
};

} // namespace vclink::test
