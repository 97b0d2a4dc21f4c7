// SPDX-License-Identifier: MIT
#include <string>

#include <gtest/gtest.h>

#include "fl/i18n/convert.hpp"

using fl::i18n::to_string;
using fl::i18n::to_ustring;
using fl::i18n::ustring_to_utf8;
using fl::i18n::utf8_to_ustring;

TEST(Convert, TurnsCodePointsOfEveryLengthIntoTheirUnits)
{
    const struct
    {
        const char *utf8;
        const char16_t *units;
    } rows[] = {
        {"", u""},
        {"a", u"a"},
        {"dir/file.txt", u"dir/file.txt"},
        {"\x7F", u"\x7F"},
        {"\xC2\x80", u"\x80"},
        {"\xC3\xA4", u"\u00E4"},
        {"\xDF\xBF", u"\u07FF"},
        {"\xE0\xA0\x80", u"\u0800"},
        {"\xE2\x82\xAC", u"\u20AC"},
        {"\xED\x9F\xBF", u"\uD7FF"},
        {"\xEE\x80\x80", u"\uE000"},
        {"\xEF\xBF\xBF", u"\uFFFF"},
        {"\xF0\x90\x80\x80", u"\U00010000"},
        {"\xF0\x9F\x98\x80", u"\U0001F600"},
        {"\xF4\x8F\xBF\xBF", u"\U0010FFFF"},
        {"0123456789abcde\xC3\xA4xyz", u"0123456789abcde\u00E4xyz"},
    };
    for (const auto &row : rows)
    {
        EXPECT_EQ(utf8_to_ustring(std::string(row.utf8)), row.units) << row.utf8;
        EXPECT_EQ(utf8_to_ustring(row.utf8), row.units) << row.utf8;
        EXPECT_EQ(ustring_to_utf8(row.units), row.utf8) << row.utf8;
        EXPECT_EQ(to_ustring(row.utf8), row.units) << row.utf8;
        EXPECT_EQ(to_string(row.units), row.utf8) << row.utf8;
    }
}

TEST(Convert, TakesEveryLengthOfAscii)
{
    std::string text;
    ustring units;
    for (int length = 0; length < 70; ++length)
    {
        ASSERT_EQ(utf8_to_ustring(text), units);
        ASSERT_EQ(ustring_to_utf8(units), text);
        const char letter = static_cast<char>('!' + length);
        text += letter;
        units += static_cast<char16_t>(letter);
    }
}

TEST(Convert, TakesAnUmlautAtEveryPlaceOfALongText)
{
    for (std::size_t place = 0; place < 40; ++place)
    {
        const std::string text =
            std::string(place, 'a') + "\xC3\xBC" + std::string(39 - place, 'b');
        const ustring units = ustring(place, u'a') + u'\u00FC' + ustring(39 - place, u'b');
        ASSERT_EQ(utf8_to_ustring(text), units);
        ASSERT_EQ(ustring_to_utf8(units), text);
    }
}

TEST(Convert, KeepsEmbeddedNulCharacters)
{
    const std::string text("a\0b\0", 4);
    const ustring units(u"a\0b\0", 4);
    EXPECT_EQ(utf8_to_ustring(text), units);
    EXPECT_EQ(ustring_to_utf8(units), text);
}
