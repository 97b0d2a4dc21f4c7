// SPDX-License-Identifier: MIT
#include <string>
#include <utility>
#include <vector>

#include <gtest/gtest.h>

#include "fl/filesystem/detail/path_text.hpp"
#include "fl/i18n/convert.hpp"
#include "support/text.hpp"
#include "util/path/paths.hpp"

namespace
{

using vclink::git::joinRepositoryPath;

/// The same by the host's own operations.
ustring concatenated(ustring text, const std::string &name, bool native)
{
    const ustring converted = fl::i18n::utf8_to_ustring(name);
    if (!converted.empty())
        fl::filesystem::detail::concatenate_pathname(text, converted, native);
    return text;
}

TEST(JoinRepositoryPath, AppendsTheNameBehindASeparator)
{
    EXPECT_EQ(joinRepositoryPath(upath(u"/root"), "sub/file.txt").string(), u"/root/sub/file.txt");
}

TEST(JoinRepositoryPath, LeavesTheRootAsItIsForAnEmptyName)
{
    for (const auto &root : {u"/root", u"/root/", u"/a/../b//", u"", u"/"})
        EXPECT_EQ(joinRepositoryPath(upath(root), "").string(), root);
}

TEST(JoinRepositoryPath, KeepsTheTextOfTheRoot)
{
    EXPECT_EQ(joinRepositoryPath(upath(u"/a/../b//./c"), "x").string(), u"/a/../b//./c/x");
}

TEST(JoinRepositoryPath, AddsNoSecondSeparatorToARootThatEndsInOne)
{
    EXPECT_EQ(joinRepositoryPath(upath(u"/root/"), "file").string(), u"/root/file");
    EXPECT_EQ(joinRepositoryPath(upath(u"/"), "file").string(), u"/file");
    EXPECT_EQ(joinRepositoryPath(upath(u"/root/"), "\xC3\xBC").string(), u"/root/\u00FC");
}

TEST(JoinRepositoryPath, CarriesTheBooleanOfTheRoot)
{
    for (const auto *name : {"", "file", "\xC3\xBC"})
    {
        EXPECT_TRUE(joinRepositoryPath(upath(u"/root", true), name).native()) << name;
        EXPECT_FALSE(joinRepositoryPath(upath(u"/root", false), name).native()) << name;
    }
}

TEST(JoinRepositoryPath, ReadsTheNameAsUtf8)
{
    EXPECT_EQ(joinRepositoryPath(upath(u"/r"), "gr\xC3\xBC\xC3\x9F.txt").string(),
              u"/r/gr\u00FC\u00DF.txt");
    EXPECT_EQ(joinRepositoryPath(upath(u"/r"), "\xF0\x9F\x8C\xB3").string(), u"/r/\U0001F333");
}

TEST(JoinRepositoryPath, KeepsBytesThatAreNotUtf8)
{
    for (const std::string name : {"\xFF", "a\xFF/b", "\xC3", "x\xED\xA0\x80", "\x80\x81"})
    {
        const upath joined = joinRepositoryPath(upath(u"/r"), name.c_str());
        EXPECT_EQ(vclink::test::asBytes(joined), "/r/" + name);
    }
}

TEST(JoinRepositoryPath, KeepsNothingOfTheNameBeforeInItsBuffer)
{
    const upath root(u"/r");
    ustring buffer = u"before";
    for (const auto &name : {"a/long/name/of/a/file", "b", "", "\xC3\xBC/x", "c/d", "\xFF"})
        EXPECT_EQ(joinRepositoryPath(root, name, buffer), joinRepositoryPath(root, name)) << name;
}

TEST(JoinRepositoryPath, GivesWhatTheHostsOwnOperationsGive)
{
    const std::vector<ustring> roots{u"", u"/", u"/r", u"/r/", u"r", u"//r//", u"/r\\", u"/\u00FC"};
    std::vector<std::string> names{"",    "a",   "/",    "/a",  "//",       "//a", "a/",
                                   "a/b", ".",   "..",   "\\a", "\xC3\xBC", "a b", "\xFF",
                                   "./a", "../", "a//b", ":a",  "/\xC3\xBC"};
    for (int byte = 1; byte < 256; ++byte)
        names.push_back(std::string("n") + static_cast<char>(byte) + "x");
    for (int byte = 1; byte < 256; ++byte)
        names.emplace_back(1, static_cast<char>(byte));
    for (const auto &root : roots)
    {
        for (const auto &name : names)
        {
            for (const bool native : {false, true})
            {
                EXPECT_EQ(joinRepositoryPath(upath(root, native), name.c_str()).string(),
                          concatenated(root, name, native))
                    << vclink::test::asUtf8(root) << " and " << name;
            }
        }
    }
}

} // namespace
