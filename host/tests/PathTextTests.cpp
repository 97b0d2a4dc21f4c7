// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "fl/filesystem/detail/path_text.hpp"
#include "fl/i18n/convert.hpp"
#include "support/ElementOrder.hpp"

using namespace fl::filesystem::detail;
using fl::i18n::to_string;
using vclink_host_tests::listElements;

TEST(PathText, TellsTheLengthOfTheRoot)
{
    EXPECT_EQ(get_root_path_length(u""), 0U);
    EXPECT_EQ(get_root_path_length(u"a/b"), 0U);
    EXPECT_EQ(get_root_path_length(u"/"), 1U);
    EXPECT_EQ(get_root_path_length(u"/a"), 1U);
}

TEST(PathText, WalksThePathElementByElement)
{
    using Elements = std::vector<ustring>;
    EXPECT_EQ(listElements(u""), Elements());
    EXPECT_EQ(listElements(u"/"), Elements({u"/"}));
    EXPECT_EQ(listElements(u"a"), Elements({u"a"}));
    EXPECT_EQ(listElements(u"a/b.c"), Elements({u"a", u"b.c"}));
    EXPECT_EQ(listElements(u"/a/b"), Elements({u"/", u"a", u"b"}));
}

TEST(PathText, MovesToTheEndBehindTheLastElement)
{
    const ustring path = u"/ab/c";
    unsigned long position = 0;
    ustring element = u"/";
    move_down(path, 1, position, element);
    EXPECT_EQ(position, 1U);
    EXPECT_EQ(element, u"ab");
    move_down(path, 1, position, element);
    EXPECT_EQ(position, 4U);
    EXPECT_EQ(element, u"c");
    move_down(path, 1, position, element);
    EXPECT_EQ(position, path.size());
    EXPECT_EQ(element, u"");
}

TEST(PathText, JoinsWithOneSeparatorAndKeepsOrResolvesDotsThatAreAWholeName)
{
    const struct
    {
        const char16_t *path;
        const char16_t *name;
        const char16_t *joined;
        const char16_t *resolved = nullptr;
    } rows[] = {
        {u"/root", u"a/b", u"/root/a/b"},
        {u"/root/", u"a", u"/root/a"},
        {u"/", u"a", u"/a"},
        {u"", u"a", u"a"},
        {u"/root", u".a", u"/root/.a"},
        {u"/root", u"..a", u"/root/..a"},
        {u"/root", u".a/..b/c.", u"/root/.a/..b/c."},
        {u"/root", u"", u"/root"},
        {u"", u"", u""},
        // Git reports no such name; a host may keep it or resolve it.
        {u"/a/b", u".", u"/a/b/.", u"/a/b"},
        {u"/a/b", u"..", u"/a/b/..", u"/a"},
    };
    for (const auto &row : rows)
    {
        for (const bool native : {true, false})
        {
            ustring path = row.path;
            concatenate_pathname(path, row.name, native);
            EXPECT_TRUE(path == row.joined || (row.resolved != nullptr && path == row.resolved))
                << to_string(path);
        }
    }
}

TEST(PathText, ReplacesTheExtension)
{
    const struct
    {
        const char16_t *path;
        const char16_t *extension;
        const char16_t *replaced;
    } rows[] = {
        {u"/bin/tool", u".sh", u"/bin/tool.sh"},
        {u"/bin/tool.exe", u".sh", u"/bin/tool.sh"},
        {u"/bin.d/tool", u".sh", u"/bin.d/tool.sh"},
        {u"tool.a.b", u".sh", u"tool.a.sh"},
    };
    for (const auto &row : rows)
    {
        ustring path = row.path;
        replace_extension(path, row.extension);
        EXPECT_EQ(path, row.replaced) << to_string(row.replaced);
    }
}

TEST(PathText, HasForwardSlashesInTheGenericForm)
{
    EXPECT_EQ(make_generic_form(u"/opt/host/bin"), u"/opt/host/bin");
    EXPECT_EQ(make_native_form(u"/opt/host/bin", true), u"/opt/host/bin");
    EXPECT_EQ(make_native_form(u"/opt/host/bin", false), u"/opt/host/bin");
    EXPECT_EQ(make_native_access_form(u"/opt/host/bin"), u"/opt/host/bin");
}
