// SPDX-License-Identifier: MIT
#pragma once

#include <boost/log/attributes/attribute_value_set.hpp>

namespace vclink::shell
{

/// Whether a record is the library's, and of one of these severities: others may be enabled for
/// another reader of the log.
bool isFromLibrary(const boost::log::attribute_value_set &values, unsigned severities);

} // namespace vclink::shell
