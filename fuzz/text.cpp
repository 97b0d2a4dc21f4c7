// SPDX-License-Identifier: MIT
// The conversions between bytes and the host's UTF-16, against the rules of their header followed
// one bit after the other. Input: bytes, which are also taken for UTF-16, low byte first.
#include "check.hpp"
#include "fl/i18n/convert.hpp"

using namespace fl::i18n;
using vclink::fuzz::require;

namespace
{

unsigned byteAt(const std::string &bytes, std::size_t place)
{
    return place < bytes.size() ? static_cast<unsigned char>(bytes[place]) : 0;
}

/// How many bytes a sequence has that begins with this one; 0 when none does.
std::size_t lengthAfter(unsigned first)
{
    if (first < 0x80)
        return 1;
    if (first >= 0xC0 && first < 0xE0)
        return 2;
    if (first >= 0xE0 && first < 0xF0)
        return 3;
    return first >= 0xF0 && first < 0xF8 ? 4 : 0;
}

/// The code point of the well-formed sequence that begins here; `length` is 0 when there is none.
char32_t decodePlainly(const std::string &bytes, std::size_t place, std::size_t &length)
{
    static const char32_t least[] = {0, 0, 0x80, 0x800, 0x10000};
    const unsigned first = byteAt(bytes, place);
    length = lengthAfter(first);
    char32_t value = length == 1 ? first : first & (0x7FU >> length);
    for (std::size_t i = 1; i < length; ++i)
    {
        const unsigned next = byteAt(bytes, place + i);
        if ((next & 0xC0U) != 0x80)
            length = 0;
        value = (value << 6U) | (next & 0x3FU);
    }
    const bool isSurrogate = value >= 0xD800 && value < 0xE000;
    if (length != 0 && (value < least[length] || isSurrogate || value > 0x10FFFF))
        length = 0;
    return value;
}

ustring widenPlainly(const std::string &bytes)
{
    ustring text;
    for (std::size_t place = 0; place < bytes.size();)
    {
        std::size_t length = 0;
        const char32_t value = decodePlainly(bytes, place, length);
        if (length == 0)
            text += static_cast<char16_t>(0xDC00 + byteAt(bytes, place));
        else if (value < 0x10000)
            text += static_cast<char16_t>(value);
        else
            text += {static_cast<char16_t>(0xD7C0 + (value >> 10U)),
                     static_cast<char16_t>(0xDC00 + (value & 0x3FFU))};
        place += length == 0 ? 1 : length;
    }
    return text;
}

void appendPlainly(std::string &bytes, char32_t value)
{
    const auto append = [&](char32_t byte) { bytes += static_cast<char>(byte); };
    const auto appendRest = [&](unsigned shift) { append(0x80 | ((value >> shift) & 0x3F)); };
    if (value < 0x80)
    {
        append(value);
    }
    else if (value < 0x800)
    {
        append(0xC0 | (value >> 6U));
        appendRest(0);
    }
    else if (value < 0x10000)
    {
        append(0xE0 | (value >> 12U));
        appendRest(6);
        appendRest(0);
    }
    else
    {
        append(0xF0 | (value >> 18U));
        appendRest(12);
        appendRest(6);
        appendRest(0);
    }
}

std::string narrowPlainly(const ustring &text)
{
    std::string bytes;
    for (std::size_t i = 0; i < text.size(); ++i)
    {
        const char16_t unit = text[i];
        const char16_t next = i + 1 < text.size() ? text[i + 1] : u'\0';
        if (unit >= 0xD800 && unit < 0xDC00 && next >= 0xDC00 && next < 0xE000)
        {
            appendPlainly(bytes, 0x10000 + ((unit - 0xD800U) << 10U) + (next - 0xDC00U));
            ++i;
        }
        else if (unit >= 0xDC80 && unit < 0xDD00)
        {
            bytes += static_cast<char>(unit - 0xDC00);
        }
        else
        {
            appendPlainly(bytes, unit);
        }
    }
    return bytes;
}

ustring unitsOf(const std::string &bytes)
{
    ustring text;
    for (std::size_t i = 0; i + 1 < bytes.size(); i += 2)
        text += static_cast<char16_t>(byteAt(bytes, i) | (byteAt(bytes, i + 1) << 8U));
    return text;
}

void checkBytes(const std::string &bytes)
{
    const ustring text = utf8_to_ustring(bytes);
    require(text == widenPlainly(bytes), "bytes become UTF-16 by the rules");
    require(ustring_to_utf8(text) == bytes, "bytes come back from UTF-16");
    const ustring upToNul = widenPlainly(bytes.substr(0, bytes.find('\0')));
    require(utf8_to_ustring(bytes.c_str()) == upToNul, "a plain pointer ends at its NUL");
    require(to_ustring(bytes.c_str()) == upToNul, "narrow text is UTF-8");
}

void checkText(const ustring &text)
{
    const std::string bytes = ustring_to_utf8(text);
    require(bytes == narrowPlainly(text), "UTF-16 becomes bytes by the rules");
    require(to_string(text) == bytes, "narrow text is UTF-8");
    checkBytes(bytes);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size)
{
    const std::string bytes = vclink::fuzz::bytesOf(data, size);
    checkBytes(bytes);
    checkText(unitsOf(bytes));
    return 0;
}
