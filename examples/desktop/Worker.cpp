// SPDX-License-Identifier: MIT
#include "Worker.hpp"

#include <utility>

namespace vclink::desktop
{

Worker::Worker() : thread_([this] { work(); })
{
}

Worker::~Worker()
{
    {
        const std::lock_guard lock(mutex_);
        ends_ = true;
    }
    wake_.notify_one();
    thread_.join();
}

void Worker::post(Job job)
{
    {
        const std::lock_guard lock(mutex_);
        jobs_.push_back(std::move(job));
    }
    wake_.notify_one();
}

void Worker::work()
{
    std::unique_lock lock(mutex_);
    for (;;)
    {
        wake_.wait(lock, [this] { return ends_ || !jobs_.empty(); });
        if (ends_)
            return;
        const Job job = std::move(jobs_.front());
        jobs_.pop_front();
        lock.unlock();
        job();
        lock.lock();
    }
}

} // namespace vclink::desktop
