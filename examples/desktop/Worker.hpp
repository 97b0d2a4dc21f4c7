// SPDX-License-Identifier: MIT
#pragma once

#include <condition_variable>
#include <deque>
#include <functional>
#include <mutex>
#include <thread>

namespace vclink::desktop
{

/// The one thread that calls the library, with the queue of what it is to do.
class Worker
{
  public:
    /// Must not throw.
    using Job = std::function<void()>;

    Worker();
    Worker(const Worker &) = delete;
    Worker &operator=(const Worker &) = delete;
    /// Waits for the job that runs, and drops those behind it.
    ~Worker();

    void post(Job job);

  private:
    void work();

    std::mutex mutex_;
    std::condition_variable wake_;
    std::deque<Job> jobs_;
    bool ends_ = false;
    std::thread thread_;
};

} // namespace vclink::desktop
