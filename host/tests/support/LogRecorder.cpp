// SPDX-License-Identifier: MIT
#include "support/LogRecorder.hpp"

#include <boost/log/attributes/value_extraction.hpp>
#include <boost/log/core.hpp>
#include <boost/log/sinks/basic_sink_backend.hpp>
#include <boost/log/sinks/sync_frontend.hpp>
#include <boost/smart_ptr/make_shared_object.hpp>

namespace vclink_host_tests
{

class RecordingBackend
    : public boost::log::sinks::basic_sink_backend<boost::log::sinks::synchronized_feeding>
{
  public:
    void consume(const boost::log::record_view &record)
    {
        // extract() gives an empty reference, and get() asserts, for a value of another type.
        records.push_back({boost::log::extract<unsigned>("Severity", record).get(),
                           boost::log::extract<std::string>("Channel", record).get(),
                           boost::log::extract<std::string>("Message", record).get()});
    }

    std::vector<SeenRecord> records;
};

struct LogRecorder::Impl
{
    boost::shared_ptr<RecordingBackend> backend = boost::make_shared<RecordingBackend>();
    boost::shared_ptr<boost::log::sinks::synchronous_sink<RecordingBackend>> sink =
        boost::make_shared<boost::log::sinks::synchronous_sink<RecordingBackend>>(backend);
};

LogRecorder::LogRecorder() : impl_(std::make_unique<Impl>())
{
    boost::log::core::get()->add_sink(impl_->sink);
}

LogRecorder::~LogRecorder()
{
    boost::log::core::get()->remove_sink(impl_->sink);
}

const std::vector<SeenRecord> &LogRecorder::records() const
{
    return impl_->backend->records;
}

LoggingSwitchedOff::LoggingSwitchedOff()
{
    boost::log::core::get()->set_logging_enabled(false);
}

LoggingSwitchedOff::~LoggingSwitchedOff()
{
    boost::log::core::get()->set_logging_enabled(true);
}

} // namespace vclink_host_tests
