// SPDX-License-Identifier: MIT
// Names that a host's text type can lose.
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "DesktopFixture.hpp"
#include "fl/i18n/convert.hpp"
#include "text.hpp"

namespace
{

using namespace vclink::test;
using vclink::desktop::toQString;
using vclink::desktop::toUstring;

class Names : public DesktopFixture, public testing::WithParamInterface<const char *>
{
};

TEST_P(Names, SurviveTheWayThroughTheWindow)
{
    const std::string name = GetParam();
    repository_.write(name, "first\n");
    open();
    select({name});
    choose("add");
    ASSERT_TRUE(becomes(name, "added"));
    EXPECT_EQ(repository_.git({"ls-files", "-z"}), name + '\0');
    repository_.write(name, "second\n");
    choose("commit");
    fill({"Name"});
    settle();
    repository_.write(name, "third\n");
    ASSERT_TRUE(becomes(name, "modified"));
    select({name});
    choose("revert");
    confirm();
    settle();
    EXPECT_EQ(repository_.read(name), "second\n");
    choose("undo");
    settle();
    EXPECT_EQ(repository_.read(name), "third\n");
}

INSTANTIATE_TEST_SUITE_P(Of, Names,
                         testing::Values("caf\xE9.txt", "\xEF\xBB\xBFmark.txt", "\xF0\x9F\xA6\x89",
                                         "folder \xFF/a b", "line\nfeed", "#x!",
                                         "\xE2\x80\xAE"
                                         "txt"));

TEST(Text, KeepsEveryCodeUnitBothWays)
{
    for (const ustring &text : {ustring(u"\uFEFFx"), ustring{0xDCE9, u'x'}, ustring{0xD83E, 0xDD89},
                                ustring{0xFFFE}, ustring()})
        EXPECT_EQ(toUstring(toQString(text)), text);
}

TEST(Text, ShowsWhatCannotBeSeen)
{
    const auto shown = [](const ustring &name)
    { return vclink::desktop::toUtf8(vclink::desktop::printable(name)); };
    EXPECT_EQ(shown(u"\uFEFFmark"), "\\ufeffmark");
    EXPECT_EQ(shown({u'a', 0xDCE9}), "a\\xe9");
    EXPECT_EQ(shown(u"a\nb"), "a\\u000ab");
    EXPECT_EQ(shown(u"\u202Etxt"), "\\u202etxt");
    EXPECT_EQ(shown({0xD83E, 0xDD89}), "\xF0\x9F\xA6\x89");
}

} // namespace
