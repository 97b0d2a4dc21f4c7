// SPDX-License-Identifier: MIT
#include "LogOutput.hpp"

#include <iostream>
#include <string>

#include <boost/algorithm/string/replace.hpp>
#include <boost/core/null_deleter.hpp>
#include <boost/log/attributes/value_extraction.hpp>
#include <boost/log/core.hpp>
#include <boost/log/expressions.hpp>
#include <boost/log/sinks/sync_frontend.hpp>
#include <boost/log/sinks/text_ostream_backend.hpp>
#include <boost/make_shared.hpp>

#include "Output.hpp"
#include "ProgressLine.hpp"
#include "fl/i18n/convert.hpp"
#include "libraryRecords.hpp"
#include "names.hpp"
#include "severities.hpp"
#include "vclink_host/logging.hpp"

namespace vclink::shell
{
namespace
{

using Sink = boost::log::sinks::synchronous_sink<boost::log::sinks::text_ostream_backend>;

void formatRecord(const boost::log::record_view &record, boost::log::formatting_ostream &stream)
{
    const auto severity = boost::log::extract_or_default<unsigned>("Severity", record, 0U);
    const auto message = boost::log::extract<std::string>("Message", record);
    std::string text =
        message ? makePrintable(fl::i18n::utf8_to_ustring(message.get())) : std::string();
    boost::algorithm::replace_all(text, "\n", "\n    ");
    text = errorsAreOnTerminal() ? escapeDirections(text) : text;
    stream << '[' << severityName(severity) << "] " << text;
}

boost::shared_ptr<Sink> makeSink(unsigned severities, ProgressLine &progressLine)
{
    const auto backend = boost::make_shared<boost::log::sinks::text_ostream_backend>();
    backend->add_stream(boost::shared_ptr<std::ostream>(&std::cerr, boost::null_deleter()));
    backend->auto_flush(true);
    auto sink = boost::make_shared<Sink>(backend);
    sink->set_filter([severities](const boost::log::attribute_value_set &values)
                     { return isFromLibrary(values, severities); });
    sink->set_formatter(
        [&progressLine](const boost::log::record_view &record,
                        boost::log::formatting_ostream &stream)
        {
            progressLine.clear();
            formatRecord(record, stream);
        });
    return sink;
}

} // namespace

struct LogOutput::Impl
{
    boost::shared_ptr<Sink> sink;
};

LogOutput::LogOutput(unsigned severities, ProgressLine &progressLine)
    : impl_(std::make_unique<Impl>(Impl{makeSink(severities, progressLine)}))
{
    boost::log::core::get()->add_sink(impl_->sink);
    vclink_host::setEnabledSeverities(libraryLogger, severities);
}

LogOutput::~LogOutput()
{
    vclink_host::setEnabledSeverities(libraryLogger, 0);
    boost::log::core::get()->remove_sink(impl_->sink);
}

} // namespace vclink::shell
