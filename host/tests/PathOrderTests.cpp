// SPDX-License-Identifier: MIT
#include <algorithm>

#include <gtest/gtest.h>

#include "fl/i18n/convert.hpp"
#include "support/ElementOrder.hpp"
#include "vclink/FileStateMap.hpp"

using fl::i18n::to_string;
using vclink_host_tests::listElements;
using vclink_host_tests::makeRandomPaths;

namespace
{

bool isLess(const ustring &left, const ustring &right)
{
    return vclink::FileStateMap().key_comp()(upath(left), upath(right));
}

} // namespace

TEST(PathOrder, ComparesElementsAndTheirUnitsNotTextsAndCodePoints)
{
    const struct
    {
        const char16_t *first;
        const char16_t *second;
    } rows[] = {
        // A leading part comes first.
        {u"/a", u"/a/b"},
        {u"", u"a"},
        {u"", u"/"},
        {u"/", u"/a"},
        // As texts, '-' sorts before '/'.
        {u"a/x", u"a-b/x"},
        {u"a/b/c", u"a.b"},
        {u"/r/a", u"/r/a b"},
        // U+1F600 begins with the unit D83D, which is below U+FF01.
        {u"/\U0001F600", u"/\uFF01"},
    };
    for (const auto &row : rows)
    {
        EXPECT_TRUE(isLess(row.first, row.second)) << to_string(row.second);
        EXPECT_FALSE(isLess(row.second, row.first)) << to_string(row.second);
        EXPECT_FALSE(isLess(row.first, row.first)) << to_string(row.first);
    }
}

TEST(PathOrder, TakesNoNoticeOfTheNativeForm)
{
    const auto less = vclink::FileStateMap().key_comp();
    EXPECT_FALSE(less(upath(u"/a", true), upath(u"/a", false)));
    EXPECT_FALSE(less(upath(u"/a", false), upath(u"/a", true)));
}

TEST(PathOrder, AgreesWithTheWalkOverTheElements)
{
    struct Walked
    {
        upath path;
        std::vector<ustring> elements;
    };
    std::vector<Walked> walked;
    for (const ustring &text : makeRandomPaths(1, 1000))
        walked.push_back({upath(text), listElements(text)});
    const auto less = vclink::FileStateMap().key_comp();
    for (const Walked &left : walked)
    {
        for (const Walked &right : walked)
        {
            ASSERT_EQ(less(left.path, right.path), left.elements < right.elements)
                << '"' << to_string(left.path.string()) << "\" \"" << to_string(right.path.string())
                << '"';
        }
    }
}

TEST(PathOrder, IsAStrictWeakOrder)
{
    const auto paths = makeRandomPaths(2, 90);
    const auto isEquivalent = [](const ustring &left, const ustring &right)
    { return !isLess(left, right) && !isLess(right, left); };
    for (const ustring &a : paths)
    {
        ASSERT_FALSE(isLess(a, a));
        for (const ustring &b : paths)
        {
            ASSERT_FALSE(isLess(a, b) && isLess(b, a));
            for (const ustring &c : paths)
            {
                ASSERT_TRUE(!(isLess(a, b) && isLess(b, c)) || isLess(a, c));
                ASSERT_TRUE(!(isEquivalent(a, b) && isEquivalent(b, c)) || isEquivalent(a, c));
            }
        }
    }
}
