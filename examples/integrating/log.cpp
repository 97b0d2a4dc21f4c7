// SPDX-License-Identifier: MIT
#include <iostream>
#include <string>

#include <boost/core/null_deleter.hpp>
#include <boost/log/core.hpp>
#include <boost/log/expressions.hpp>
#include <boost/log/sinks/sync_frontend.hpp>
#include <boost/log/sinks/text_ostream_backend.hpp>
#include <boost/log/utility/exception_handler.hpp>
#include <boost/make_shared.hpp>

#include "vclink_host/logging.hpp"

void showLog()
{
    namespace log = boost::log;
    log::core::get()->set_exception_handler(log::make_exception_suppressor());
    using Sink = log::sinks::synchronous_sink<log::sinks::text_ostream_backend>;
    const auto sink = boost::make_shared<Sink>();
    sink->locked_backend()->add_stream(
        boost::shared_ptr<std::ostream>(&std::clog, boost::null_deleter()));
    sink->set_filter(log::expressions::attr<std::string>("Channel") == "vclink::git");
    sink->set_formatter(log::expressions::stream << log::expressions::attr<unsigned>("Severity")
                                                 << ' ' << log::expressions::smessage);
    log::core::get()->add_sink(sink);
    vclink_host::setEnabledSeverities("vclink::git", 0x08 | 0x10);
}
