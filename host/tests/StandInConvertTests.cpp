// SPDX-License-Identifier: MIT
#include <random>
#include <string>

#include <gtest/gtest.h>

#include "fl/i18n/convert.hpp"
#include "support/AllocationCounter.hpp"

using fl::i18n::ustring_to_utf8;
using fl::i18n::utf8_to_ustring;

namespace
{

std::string oneByte(int value)
{
    return std::string(1, static_cast<char>(value));
}

/// The text in which every byte has become its escape.
ustring escapeAll(const std::string &bytes)
{
    ustring text;
    for (const char byte : bytes)
        text += static_cast<char16_t>(0xDC00 + static_cast<unsigned char>(byte));
    return text;
}

} // namespace

TEST(StandInConvert, BringsEveryByteAndEveryPairOfBytesBack)
{
    for (int value = 0; value < 256; ++value)
    {
        const std::string bytes = oneByte(value);
        const ustring text = utf8_to_ustring(bytes);
        ASSERT_EQ(text, value < 0x80 ? ustring(1, static_cast<char16_t>(value)) : escapeAll(bytes));
        ASSERT_EQ(ustring_to_utf8(text), bytes);
        for (int second = 0; second < 256; ++second)
        {
            const std::string pair = bytes + oneByte(second);
            ASSERT_EQ(ustring_to_utf8(utf8_to_ustring(pair)), pair) << value << ' ' << second;
        }
    }
}

TEST(StandInConvert, BringsRandomBytesBack)
{
    std::mt19937 random(20240);
    // Bytes that open, continue and break sequences come up more often than in plain noise.
    const std::string alphabet(
        "a/\0\x7F\x80\xBF\xC0\xC2\xC3\xDF\xE0\xED\xA0\x9F\xEF\xF0\x90\xF4\x8F"
        "\xF5\xFF",
        21);
    std::uniform_int_distribution<std::size_t> length(0, 40);
    std::uniform_int_distribution<std::size_t> letter(0, alphabet.size() - 1);
    for (int round = 0; round < 50000; ++round)
    {
        std::string bytes(length(random), '\0');
        for (char &byte : bytes)
            byte = alphabet[letter(random)];
        ASSERT_EQ(ustring_to_utf8(utf8_to_ustring(bytes)), bytes) << "round " << round;
    }
}

TEST(StandInConvert, EscapesEachByteThatBelongsToNoSequence)
{
    const char *const rows[] = {
        "\x80",             // a continuation byte alone
        "\xC3",             // cut short
        "\xE2\x82",         // cut short after two of three
        "\xF0\x9F\x98",     // cut short after three of four
        "\xC0\xAF",         // '/' in two bytes
        "\xC1\xBF",         // overlong
        "\xE0\x80\xAF",     // '/' in three bytes
        "\xE0\x9F\xBF",     // overlong
        "\xF0\x80\x80\xAF", // '/' in four bytes
        "\xF0\x8F\xBF\xBF", // overlong
        "\xED\xA0\x80",     // U+D800
        "\xED\xB2\x80",     // U+DC80, an escape's own number
        "\xED\xBF\xBF",     // U+DFFF
        "\xF4\x90\x80\x80", // U+110000
        "\xF5\x80\x80\x80", // above
        "\xFE\xFF",         // never part of UTF-8
    };
    for (const char *row : rows)
    {
        EXPECT_EQ(utf8_to_ustring(row), escapeAll(row));
        EXPECT_EQ(ustring_to_utf8(escapeAll(row)), row);
    }
}

TEST(StandInConvert, GoesOnAfterABrokenSequence)
{
    const ustring expected = escapeAll("\xE2\x82") + u"a" + escapeAll("\xC3") + u"\u00E4z";
    EXPECT_EQ(utf8_to_ustring("\xE2\x82"
                              "a\xC3\xC3\xA4z"),
              expected);
}

TEST(StandInConvert, KeepsOtherLoneSurrogatesApart)
{
    const ustring high(1, char16_t(0xD800));
    const ustring low(1, char16_t(0xDC00));
    EXPECT_EQ(ustring_to_utf8(high), "\xED\xA0\x80");
    EXPECT_EQ(ustring_to_utf8(low), "\xED\xB0\x80");
    EXPECT_EQ(ustring_to_utf8(ustring(1, char16_t(0xDD00))), "\xED\xB4\x80");
    EXPECT_EQ(ustring_to_utf8(high + u"a" + low), "\xED\xA0\x80"
                                                  "a\xED\xB0\x80");
    // Their bytes come back as escapes, which mean the same bytes.
    EXPECT_EQ(utf8_to_ustring("\xED\xA0\x80"), escapeAll("\xED\xA0\x80"));
    EXPECT_EQ(ustring_to_utf8(utf8_to_ustring(ustring_to_utf8(high))), "\xED\xA0\x80");
}

TEST(StandInConvert, TakesANullPointerAsAnEmptyTextAndEndsAnotherAtItsNul)
{
    EXPECT_EQ(utf8_to_ustring(static_cast<const char *>(nullptr)), ustring());
    EXPECT_EQ(fl::i18n::to_ustring(nullptr), ustring());
    EXPECT_EQ(utf8_to_ustring("ab\0cd"), u"ab");
}

TEST(StandInConvert, AllocatesOnceForATextOfAnyKind)
{
    const std::string ascii(40, 'a');
    const std::string mixed = ascii + "\xC3\xA4\xFF\xF0\x9F\x98\x80" + ascii;
    for (const std::string &text : {ascii, mixed})
    {
        const vclink::test::AllocationCounter counter;
        const ustring units = utf8_to_ustring(text);
        EXPECT_EQ(counter.count(), 1U);
        const std::string bytes = ustring_to_utf8(units);
        EXPECT_EQ(counter.count(), 2U);
        EXPECT_EQ(bytes, text);
    }
}
