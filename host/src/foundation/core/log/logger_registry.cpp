// SPDX-License-Identifier: MIT
#include "foundation/core/log/logger_registry.hpp"

#include "vclink_host/logging.hpp"

namespace foundation::core::log
{

LoggerRegistry &LoggerRegistry::instance()
{
    static LoggerRegistry registry;
    return registry;
}

void LoggerRegistry::attach(const std::string &name, std::atomic<unsigned> &mask)
{
    const std::lock_guard<std::mutex> lock(mutex_);
    loggers_.emplace(&mask, name);
    const auto asked = asked_.find(name);
    if (asked != asked_.end())
    {
        mask.store(asked->second, std::memory_order_relaxed);
    }
}

void LoggerRegistry::detach(std::atomic<unsigned> &mask) noexcept
{
    const std::lock_guard<std::mutex> lock(mutex_);
    loggers_.erase(&mask);
}

void LoggerRegistry::setMask(const std::string &name, unsigned mask)
{
    const std::lock_guard<std::mutex> lock(mutex_);
    asked_[name] = mask;
    for (const auto &[logger, loggerName] : loggers_)
    {
        if (loggerName == name)
        {
            logger->store(mask, std::memory_order_relaxed);
        }
    }
}

unsigned LoggerRegistry::getMask(const std::string &name)
{
    const std::lock_guard<std::mutex> lock(mutex_);
    bool isAlive = false;
    unsigned mask = 0;
    for (const auto &[logger, loggerName] : loggers_)
    {
        if (loggerName == name)
        {
            isAlive = true;
            mask |= logger->load(std::memory_order_relaxed);
        }
    }
    const auto asked = asked_.find(name);
    return isAlive || asked == asked_.end() ? mask : asked->second;
}

} // namespace foundation::core::log

namespace vclink_host
{

void setEnabledSeverities(const std::string &loggerName, unsigned mask)
{
    foundation::core::log::LoggerRegistry::instance().setMask(loggerName, mask);
}

unsigned getEnabledSeverities(const std::string &loggerName)
{
    return foundation::core::log::LoggerRegistry::instance().getMask(loggerName);
}

} // namespace vclink_host
