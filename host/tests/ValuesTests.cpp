// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "fl/i18n/VkLocale.hpp"
#include "vclink/FileState.hpp"
#include "vclink/FileStateMap.hpp"
#include "vclink/util/generateFileReport.hpp"

using vclink::FileState;

TEST(FileStateValue, HasTheNumbersOfTheBoundary)
{
    const FileState::State states[] = {
        FileState::Unversioned, FileState::Clean, FileState::Unknown, FileState::InConflict,
        FileState::Modified,    FileState::Added, FileState::Deleted, FileState::Missing};
    std::int32_t number = 0;
    for (const FileState::State state : states)
    {
        EXPECT_EQ(state, number);
        EXPECT_EQ(FileState(number).getState(), state);
        ++number;
    }
    EXPECT_EQ(sizeof(FileState), 4U);
    EXPECT_TRUE(FileState(1) == FileState(FileState::Clean));
    EXPECT_TRUE(FileState(1) != FileState(2));
}

TEST(PathValue, IsEmptyAndNativeByDefault)
{
    const upath path;
    EXPECT_EQ(path.string(), ustring());
    EXPECT_TRUE(path.native());
}

TEST(PathValue, KeepsItsTextAsItWasGiven)
{
    const upath path(u"/a//b/../c/", false);
    EXPECT_EQ(path.string(), u"/a//b/../c/");
    EXPECT_FALSE(path.native());
    EXPECT_TRUE(path == upath(u"/a//b/../c/"));
    EXPECT_TRUE(path != upath(u"/a/b/../c/"));
}

TEST(FileStateMapValue, IsInTheOrderOfPaths)
{
    vclink::FileStateMap map;
    for (const char16_t *path : {u"/r/b", u"/r/a-b/x", u"/r/a/x", u"/r/a"})
    {
        map.emplace(upath(path), FileState(1));
    }
    std::vector<ustring> keys;
    for (const auto &entry : map)
    {
        keys.push_back(entry.first.string());
    }
    EXPECT_EQ(keys, (std::vector<ustring>{u"/r/a", u"/r/a/x", u"/r/a-b/x", u"/r/b"}));
}

TEST(FileReport, ListsEachPath)
{
    const ustring report = vclink::util::generateFileReport({upath(u"/one"), upath(u"/two/three")});
    EXPECT_NE(report.find(u"/one"), ustring::npos);
    EXPECT_NE(report.find(u"/two/three"), ustring::npos);
}

TEST(LocaleValue, KeepsItsName)
{
    EXPECT_EQ(fl::i18n::VkLocale().name(), "");
    EXPECT_EQ(fl::i18n::VkLocale("de_DE.UTF-8").name(), "de_DE.UTF-8");
}
