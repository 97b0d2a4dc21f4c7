// SPDX-License-Identifier: MIT
#pragma once

#include <string>

/// The text of the host: UTF-16 code units in the machine's byte order.
///
/// A text of a file name that is not valid UTF-8 has a lone low surrogate for each byte that could
/// not be decoded; see fl/i18n/convert.hpp.
using ustring = std::basic_string<char16_t>;
