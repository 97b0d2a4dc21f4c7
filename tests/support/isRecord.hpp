// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <gmock/gmock.h>

#include "support/LogCapture.hpp"

namespace vclink::test
{

/// Matches a record with this severity and this text, whatever its channel.
inline auto isRecord(unsigned severity, const std::string &message)
{
    return testing::AllOf(testing::Field(&LogRecord::severity, severity),
                          testing::Field(&LogRecord::message, message));
}

} // namespace vclink::test
