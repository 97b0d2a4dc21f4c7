// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "fl/ustring.hpp"
#include "vclink_host/export.hpp"

/// Conversions between narrow text and the host's UTF-16 text.
///
/// They lose nothing on the way from bytes to UTF-16 and back: for every byte string `bytes`,
/// `ustring_to_utf8(utf8_to_ustring(bytes)) == bytes`, whatever the bytes are. This is how a file
/// whose name is not valid UTF-8 stays within the host's reach. The rules:
///
/// - A well-formed UTF-8 sequence becomes its code point, as one or two code units.
/// - Each byte that belongs to no well-formed sequence (a stray continuation byte, an overlong
///   form, an encoded surrogate, a value above U+10FFFF, a sequence cut short) becomes one lone low
///   surrogate, U+DC00 plus the byte: U+DC80 to U+DCFF.
/// - On the way back a lone low surrogate of that range becomes its byte again. Every other lone
///   surrogate becomes the three bytes that UTF-8's scheme gives for its number, so that two
///   different texts of this kind stay different; these three bytes come back as three escaped
///   bytes, which encode to the same three bytes.
/// - Embedded NUL characters are ordinary characters in both directions, save in the overload that
///   takes a plain pointer, which ends at the first one.
///
/// All functions may be called from any thread. They raise std::bad_alloc only.
namespace fl::i18n
{

/// UTF-16 to UTF-8 by the rules above.
VCLINK_HOST_EXPORT std::string ustring_to_utf8(const ustring &text);

/// UTF-8 to UTF-16 by the rules above, embedded NUL characters included.
VCLINK_HOST_EXPORT ustring utf8_to_ustring(const std::string &text);

/// UTF-8 to UTF-16 by the rules above, up to the terminating NUL. A null pointer gives an empty
/// text.
VCLINK_HOST_EXPORT ustring utf8_to_ustring(const char *text);

/// Narrow text of the process (exception texts and the like) to UTF-16. Narrow text is UTF-8 on
/// this platform, so this is utf8_to_ustring.
VCLINK_HOST_EXPORT ustring to_ustring(const char *text);

/// UTF-16 to the narrow text of the process: ustring_to_utf8 on this platform.
VCLINK_HOST_EXPORT std::string to_string(const ustring &text);

} // namespace fl::i18n
