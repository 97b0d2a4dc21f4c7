// SPDX-License-Identifier: MIT
#include "support/LogCapture.hpp"

#include <mutex>
#include <utility>

#include <boost/log/attributes/value_extraction.hpp>
#include <boost/log/core/core.hpp>
#include <boost/log/core/record_view.hpp>
#include <boost/log/sinks/basic_sink_backend.hpp>
#include <boost/log/sinks/sync_frontend.hpp>
#include <boost/make_shared.hpp>

#include "vclink_host/logging.hpp"

namespace vclink::test
{
namespace
{

namespace logging = boost::log;

std::string textOf(const char *attribute, const logging::record_view &view)
{
    const auto value = logging::extract<std::string>(attribute, view);
    return value ? *value : std::string();
}

} // namespace

class CapturingBackend
    : public logging::sinks::basic_sink_backend<logging::sinks::concurrent_feeding>
{
  public:
    explicit CapturingBackend(std::string channel) : channel_(std::move(channel))
    {
    }

    void consume(const logging::record_view &view)
    {
        std::string channel = textOf("Channel", view);
        if (channel != channel_)
            return;
        LogRecord record{logging::extract_or_default<unsigned>("Severity", view, 0u),
                         std::move(channel), textOf("Message", view)};
        {
            const std::lock_guard<std::mutex> lock(mutex_);
            records_.push_back(record);
        }
        if (onRecord)
            onRecord(record);
    }

    std::vector<LogRecord> records() const
    {
        const std::lock_guard<std::mutex> lock(mutex_);
        return records_;
    }

    void clear()
    {
        const std::lock_guard<std::mutex> lock(mutex_);
        records_.clear();
    }

    std::function<void(const LogRecord &)> onRecord;

  private:
    const std::string channel_;
    mutable std::mutex mutex_;
    std::vector<LogRecord> records_;
};

using CapturingSink = logging::sinks::synchronous_sink<CapturingBackend>;

struct LogCapture::Impl
{
    explicit Impl(const std::string &name)
        : logger(name), severitiesBefore(vclink_host::getEnabledSeverities(name)),
          backend(boost::make_shared<CapturingBackend>(name)),
          sink(boost::make_shared<CapturingSink>(backend))
    {
    }

    const std::string logger;
    const unsigned severitiesBefore;
    const boost::shared_ptr<CapturingBackend> backend;
    const boost::shared_ptr<CapturingSink> sink;
};

LogCapture::LogCapture(unsigned severities, const std::string &logger)
    : impl_(std::make_unique<Impl>(logger))
{
    logging::core::get()->add_sink(impl_->sink);
    vclink_host::setEnabledSeverities(logger, severities);
}

LogCapture::~LogCapture()
{
    vclink_host::setEnabledSeverities(impl_->logger, impl_->severitiesBefore);
    logging::core::get()->remove_sink(impl_->sink);
}

std::vector<LogRecord> LogCapture::records() const
{
    return impl_->backend->records();
}

std::vector<std::string> LogCapture::messages(unsigned severity) const
{
    std::vector<std::string> messages;
    for (auto &record : impl_->backend->records())
    {
        if ((record.severity & severity) != 0)
            messages.push_back(std::move(record.message));
    }
    return messages;
}

void LogCapture::clear()
{
    impl_->backend->clear();
}

void LogCapture::onRecord(std::function<void(const LogRecord &)> told)
{
    impl_->backend->onRecord = std::move(told);
}

} // namespace vclink::test
