// SPDX-License-Identifier: MIT
#include "fl/i18n/convert.hpp"

#include <array>
#include <cstddef>
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

/// A code point, or the escape of a byte, whose value is `value` - escapeOffset. `length` is its
/// length in the source text.
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

/// The bits that no unit of an ASCII text has, for all units in a word.
template <class Unit>
constexpr std::uint64_t notAscii = sizeof(Unit) == 1 ? 0x8080808080808080U : 0xFF80FF80FF80FF80U;

/// Copies some units. Returns false, and writes nothing, if one of them is not ASCII. The copies to
/// and from arrays allow the compiler to process all units at once: a plain `char` might alias
/// anything.
template <std::size_t count, class To, class From>
inline bool copyAscii(const From *from, To *to) noexcept
{
    std::array<From, count> units;
    std::array<std::uint64_t, sizeof units / sizeof(std::uint64_t)> words;
    std::memcpy(units.data(), from, sizeof units);
    std::memcpy(words.data(), from, sizeof words);
    std::uint64_t bits = 0;
    for (const std::uint64_t word : words)
    {
        bits |= word;
    }
    if ((bits & notAscii<From>) != 0)
    {
        return false;
    }
    std::array<To, count> copied;
    for (std::size_t index = 0; index != count; ++index)
    {
        copied[index] = static_cast<To>(units[index]);
    }
    std::memcpy(to, copied.data(), sizeof copied);
    return true;
}

/// Copies by blocks up to one with a unit that is not ASCII. The last block overlaps the one before
/// it if the end does not fill a block.
/// @return the number of copied units
template <std::size_t count, class To, class From>
std::size_t copyAsciiBlocks(const From *from, std::size_t size, To *to) noexcept
{
    std::size_t copied = 0;
    while (size - copied >= count)
    {
        if (!copyAscii<count>(from + copied, to + copied))
        {
            return copied;
        }
        copied += count;
    }
    const bool isCut = copied != 0 && copied != size;
    return isCut && copyAscii<count>(from + size - count, to + size - count) ? size : copied;
}

/// Copies up to the first unit that is not ASCII. Nearly all texts are ASCII from end to end, and
/// there are two for each file of a status.
/// @return the number of copied units
template <class To, class From>
std::size_t copyLeadingAscii(const From *begin, const From *end, To *out) noexcept
{
    const auto size = static_cast<std::size_t>(end - begin);
    std::size_t copied = copyAsciiBlocks<16>(begin, size, out);
    copied += copyAsciiBlocks<8>(begin + copied, size - copied, out + copied);
    for (; copied != size && isAscii(begin[copied]); ++copied)
    {
        out[copied] = static_cast<To>(begin[copied]);
    }
    return copied;
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
    // Creates an ASCII path directly, so that its string is not filled first.
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
