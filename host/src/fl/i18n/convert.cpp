// SPDX-License-Identifier: MIT
#include "fl/i18n/convert.hpp"

#include <array>
#include <cstdint>
#include <cstring>
#include <string_view>
#include <type_traits>

#include <boost/locale/utf.hpp>

namespace fl::i18n
{
namespace
{

using boost::locale::utf::code_point;
using Utf8 = boost::locale::utf::utf_traits<char>;

constexpr code_point firstEscape = 0xDC80;
constexpr code_point lastEscape = 0xDCFF;
constexpr code_point escapeOffset = 0xDC00;
constexpr code_point firstSupplementary = 0x10000;

constexpr bool isHighSurrogate(char16_t unit) noexcept
{
    return (unit & 0xFC00) == 0xD800;
}

constexpr bool isLowSurrogate(char16_t unit) noexcept
{
    return (unit & 0xFC00) == 0xDC00;
}

/// A code point, or the escape that stands for a byte; the byte's value is `value` - escapeOffset.
/// `length` is what it takes in the text that is read.
struct Decoded
{
    code_point value;
    std::size_t length;
};

Decoded decode(const char *begin, const char *end) noexcept
{
    const char *position = begin;
    const code_point value = Utf8::decode(position, end);
    if (value == boost::locale::utf::illegal || value == boost::locale::utf::incomplete)
    {
        return {escapeOffset + static_cast<unsigned char>(*begin), 1};
    }
    return {value, static_cast<std::size_t>(position - begin)};
}

Decoded decode(const char16_t *begin, const char16_t *end) noexcept
{
    if (isHighSurrogate(*begin) && end - begin > 1 && isLowSurrogate(begin[1]))
    {
        const code_point high = *begin & 0x3FFU;
        const code_point low = begin[1] & 0x3FFU;
        return {firstSupplementary + (high << 10U) + low, 2};
    }
    return {*begin, 1};
}

std::size_t lengthIn(code_point value, char16_t /*unit*/) noexcept
{
    return value < firstSupplementary ? 1 : 2;
}

std::size_t lengthIn(code_point value, char /*unit*/) noexcept
{
    const bool isEscape = value >= firstEscape && value <= lastEscape;
    return isEscape ? 1 : static_cast<std::size_t>(Utf8::width(value));
}

char16_t *encode(code_point value, char16_t *out) noexcept
{
    if (value < firstSupplementary)
    {
        *out++ = static_cast<char16_t>(value);
        return out;
    }
    const code_point offset = value - firstSupplementary;
    *out++ = static_cast<char16_t>(0xD800U + (offset >> 10U));
    *out++ = static_cast<char16_t>(0xDC00U + (offset & 0x3FFU));
    return out;
}

char *encode(code_point value, char *out) noexcept
{
    if (value >= firstEscape && value <= lastEscape)
    {
        *out++ = static_cast<char>(value - escapeOffset);
        return out;
    }
    return Utf8::encode(value, out);
}

template <class Unit> constexpr bool isAscii(Unit unit) noexcept
{
    return static_cast<std::make_unsigned_t<Unit>>(unit) < 0x80;
}

/// Widens four bytes; false, and nothing written, when one of them is not ASCII. Each byte is
/// spread to its own unit, which holds for either order of bytes.
bool copyFourAscii(const char *from, char16_t *to) noexcept
{
    std::uint32_t bytes = 0;
    std::memcpy(&bytes, from, sizeof bytes);
    if ((bytes & 0x80808080U) != 0)
    {
        return false;
    }
    std::uint64_t units = bytes;
    units = (units | (units << 16U)) & 0x0000FFFF0000FFFFU;
    units = (units | (units << 8U)) & 0x00FF00FF00FF00FFU;
    std::memcpy(to, &units, sizeof units);
    return true;
}

/// The way back.
bool copyFourAscii(const char16_t *from, char *to) noexcept
{
    std::uint64_t units = 0;
    std::memcpy(&units, from, sizeof units);
    if ((units & 0xFF80FF80FF80FF80U) != 0)
    {
        return false;
    }
    units = (units | (units >> 8U)) & 0x0000FFFF0000FFFFU;
    const auto bytes = static_cast<std::uint32_t>(units | (units >> 16U));
    std::memcpy(to, &bytes, sizeof bytes);
    return true;
}

/// Copies up to the first unit that is not ASCII. Nearly all texts are ASCII from end to end, and
/// there are two for each file of a status.
/// @return how many were copied
template <class To, class From>
std::size_t copyLeadingAscii(const From *begin, const From *end, To *out) noexcept
{
    const From *position = begin;
    while (end - position >= 4 && copyFourAscii(position, out))
    {
        position += 4;
        out += 4;
    }
    for (; position != end && isAscii(*position); ++position)
    {
        *out++ = static_cast<To>(*position);
    }
    return static_cast<std::size_t>(position - begin);
}

template <class To, class From> std::size_t measure(const From *begin, const From *end) noexcept
{
    std::size_t length = 0;
    while (begin != end)
    {
        const Decoded decoded = decode(begin, end);
        begin += decoded.length;
        length += lengthIn(decoded.value, To());
    }
    return length;
}

template <class To, class From> void write(const From *begin, const From *end, To *out) noexcept
{
    while (begin != end)
    {
        const std::size_t ascii = copyLeadingAscii(begin, end, out);
        begin += ascii;
        out += ascii;
        if (begin != end)
        {
            const Decoded decoded = decode(begin, end);
            begin += decoded.length;
            out = encode(decoded.value, out);
        }
    }
}

template <class To, class From> std::basic_string<To> convert(std::basic_string_view<From> text)
{
    // A path that is ASCII is made here, so that its string needs no filling before.
    constexpr std::size_t capacity = 256;
    const From *const begin = text.data();
    const From *const end = begin + text.size();
    if (text.size() <= capacity)
    {
        std::array<To, capacity> buffer;
        if (copyLeadingAscii(begin, end, buffer.data()) == text.size())
        {
            return std::basic_string<To>(buffer.data(), text.size());
        }
    }
    std::basic_string<To> result(measure<To>(begin, end), To());
    write(begin, end, result.data());
    return result;
}

} // namespace

std::string ustring_to_utf8(const ustring &text)
{
    return convert<char>(std::u16string_view(text));
}

ustring utf8_to_ustring(const std::string &text)
{
    return convert<char16_t>(std::string_view(text));
}

ustring utf8_to_ustring(const char *text)
{
    return text == nullptr ? ustring() : convert<char16_t>(std::string_view(text));
}

ustring to_ustring(const char *text)
{
    return utf8_to_ustring(text);
}

std::string to_string(const ustring &text)
{
    return ustring_to_utf8(text);
}

} // namespace fl::i18n
