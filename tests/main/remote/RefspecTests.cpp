// SPDX-License-Identifier: MIT
#include <optional>
#include <string>

#include <gtest/gtest.h>

#include "main/remote/Refspec.hpp"
#include "main/remote/remotePath.hpp"

namespace
{

using vclink::git::findRemotePath;
using vclink::git::readRefspec;

TEST(Refspec, IsReadAsLibGit2ReadsIt)
{
    const struct
    {
        std::string text;
        git_direction direction;
        std::string source;
        std::string target;
        bool isForced;
    } cases[] = {{"refs/a:refs/b", GIT_DIRECTION_FETCH, "refs/a", "refs/b", false},
                 {"+a:b", GIT_DIRECTION_FETCH, "a", "refs/heads/b", true},
                 {"a:remotes/o/a", GIT_DIRECTION_FETCH, "a", "refs/remotes/o/a", false},
                 {"a", GIT_DIRECTION_FETCH, "a", "", false},
                 {"a:", GIT_DIRECTION_FETCH, "a", "", false},
                 {"+refs/a", GIT_DIRECTION_PUSH, "refs/a", "refs/a", true},
                 {":refs/a", GIT_DIRECTION_PUSH, "", "refs/a", false}};
    for (const auto &[text, direction, source, target, isForced] : cases)
    {
        const auto refspec = readRefspec(text, direction);
        EXPECT_EQ(refspec.source, source) << text;
        EXPECT_EQ(refspec.target, target) << text;
        EXPECT_EQ(refspec.isForced, isForced) << text;
    }
}

TEST(Refspec, FindsTheTargetOfAReference)
{
    const struct
    {
        std::string text;
        std::string reference;
        std::optional<std::string> target;
    } cases[] = {{"refs/a:refs/b", "refs/a", "refs/b"},
                 {"refs/a:refs/b", "refs/a/c", std::nullopt},
                 {"refs/heads/*:refs/x/*", "refs/heads/a/b", "refs/x/a/b"},
                 {"refs/heads/*:refs/x/*", "refs/head", std::nullopt},
                 {"refs/*/v1:refs/x/*/y", "refs/a/v1", "refs/x/a/y"},
                 {"refs/*/v1:refs/x/*/y", "refs/v1", std::nullopt}};
    for (const auto &[text, reference, target] : cases)
        EXPECT_EQ(readRefspec(text, GIT_DIRECTION_FETCH).findTarget(reference), target) << text;
}

TEST(Refspec, KnowsTheFoldersThatItCanReach)
{
    const struct
    {
        std::string text;
        bool reachesTags;
    } cases[] = {{"a:refs/tags/a", true},           {"a:a", false},
                 {"refs/tags/*:refs/tags/*", true}, {"refs/*:refs/*", true},
                 {"refs/*:refs/mirror/*", false},   {"refs/tags/v1", false}};
    for (const auto &[text, reachesTags] : cases)
        EXPECT_EQ(readRefspec(text, GIT_DIRECTION_FETCH).canReach("refs/tags/"), reachesTags)
            << text;
}

TEST(Refspec, IsNegativeIfItBeginsWithACircumflex)
{
    for (const auto *const text : {"^refs/heads/a", "+^refs/heads/*"})
        EXPECT_TRUE(readRefspec(text, GIT_DIRECTION_FETCH).isNegative()) << text;
    EXPECT_FALSE(readRefspec("refs/heads/^a", GIT_DIRECTION_FETCH).isNegative());
}

TEST(RemotePath, IsWhatLibGit2TakesForAFolder)
{
    const struct
    {
        std::string address;
        std::optional<std::string> path;
    } cases[] = {{"/a b", "/a b"},
                 {"../a", "../a"},
                 {"file:///a%20b%zz", "/a b%zz"},
                 {"file://localhost/a", "/a"},
                 {"https://host/a", std::nullopt},
                 {"host:a", std::nullopt}};
    for (const auto &[address, path] : cases)
        EXPECT_EQ(findRemotePath(address), path) << address;
}

} // namespace
