// SPDX-License-Identifier: MIT
#include "RecordReader.hpp"

#include <utility>

#include <boost/log/attributes/value_extraction.hpp>
#include <boost/log/core.hpp>
#include <boost/log/sinks/basic_sink_backend.hpp>
#include <boost/log/sinks/sync_frontend.hpp>
#include <boost/make_shared.hpp>

#include "libraryRecords.hpp"
#include "severities.hpp"
#include "vclink_host/logging.hpp"

namespace vclink::shell
{

class ReaderBackend
    : public boost::log::sinks::basic_sink_backend<boost::log::sinks::synchronized_feeding>
{
  public:
    explicit ReaderBackend(std::function<void(const std::string &)> take) : take_(std::move(take))
    {
    }

    void consume(const boost::log::record_view &record)
    {
        if (const auto message = boost::log::extract<std::string>("Message", record))
        {
            take_(message.get());
        }
    }

  private:
    std::function<void(const std::string &)> take_;
};

using ReaderSink = boost::log::sinks::synchronous_sink<ReaderBackend>;

struct RecordReader::Impl
{
    boost::shared_ptr<ReaderSink> sink;
    unsigned severitiesBefore;
};

RecordReader::RecordReader(unsigned severities, std::function<void(const std::string &)> take)
    : impl_(std::make_unique<Impl>(
          Impl{boost::make_shared<ReaderSink>(boost::make_shared<ReaderBackend>(std::move(take))),
               vclink_host::getEnabledSeverities(libraryLogger)}))
{
    impl_->sink->set_filter([severities](const boost::log::attribute_value_set &values)
                            { return isFromLibrary(values, severities); });
    boost::log::core::get()->add_sink(impl_->sink);
    vclink_host::setEnabledSeverities(libraryLogger, impl_->severitiesBefore | severities);
}

RecordReader::~RecordReader()
{
    vclink_host::setEnabledSeverities(libraryLogger, impl_->severitiesBefore);
    boost::log::core::get()->remove_sink(impl_->sink);
}

} // namespace vclink::shell
