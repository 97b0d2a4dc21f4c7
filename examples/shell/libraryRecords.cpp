// SPDX-License-Identifier: MIT
#include "libraryRecords.hpp"

#include <string>

#include <boost/log/attributes/value_extraction.hpp>

#include "severities.hpp"

namespace vclink::shell
{

bool isFromLibrary(const boost::log::attribute_value_set &values, unsigned severities)
{
    const auto channel = boost::log::extract<std::string>("Channel", values);
    const auto severity = boost::log::extract_or_default<unsigned>("Severity", values, 0U);
    return channel && channel.get() == libraryLogger && (severity & severities) != 0;
}

} // namespace vclink::shell
