// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "fl/ustring.hpp"
#include "vclink_host/export.hpp"

/// Conversions between narrow text and the host's UTF-16 text.
///
/// They lose nothing from bytes to UTF-16 and back: `ustring_to_utf8(utf8_to_ustring(bytes)) ==
/// bytes` for every byte string `bytes`. So a host can use a file whose name is not valid UTF-8.
/// The rules:
///
/// - A well-formed UTF-8 sequence becomes its code point, as one or two code units.
/// - Each byte that is not in a well-formed sequence (a single continuation byte, an overlong form,
/// an encoded surrogate, a value above U+10FFFF, an incomplete sequence) becomes one lone low
/// surrogate, U+DC00 plus the byte: U+DC80 to U+DCFF.
/// - On the way back a lone low surrogate of that range becomes its byte again. Every other lone
/// surrogate becomes the three bytes that UTF-8's scheme has for its number, so that different
/// texts stay different. These three bytes become three escaped bytes, which are encoded as the
/// same three bytes.
/// - Embedded NUL characters are ordinary characters in both directions, except in the overload
/// with a plain pointer, which ends at the first one.
///
/// All functions can be called from any thread. They throw only std::bad_alloc.
namespace fl::i18n
{

/// Converts UTF-16 to UTF-8 by the rules above.
VCLINK_HOST_EXPORT std::string ustring_to_utf8(const ustring &text);

/// Converts UTF-8 to UTF-16 by the rules above, including embedded NUL characters.
VCLINK_HOST_EXPORT ustring utf8_to_ustring(const std::string &text);

/// Converts UTF-8 to UTF-16 by the rules above, up to the terminating NUL. Returns an empty text
/// for a null pointer.
VCLINK_HOST_EXPORT ustring utf8_to_ustring(const char *text);

/// Converts narrow text of the process, such as exception texts, to UTF-16. Narrow text is UTF-8 on
/// this platform, so this is utf8_to_ustring.
VCLINK_HOST_EXPORT ustring to_ustring(const char *text);

/// Converts UTF-16 to the narrow text of the process: ustring_to_utf8 on this platform.
VCLINK_HOST_EXPORT std::string to_string(const ustring &text);

} // namespace fl::i18n
