// SPDX-License-Identifier: MIT
#include <array>
#include <cstdint>
#include <cstring>
#include <type_traits>
#include <utility>

#include <git2.h>
#include <gtest/gtest.h>

#include "error/HermeticLibGit2.hpp"
#include "error/makeError.hpp"
#include "fl/i18n/convert.hpp"

namespace vclink::git
{
namespace
{

using test::isError;
using test::makeError;

static_assert(std::is_same_v<decltype(std::declval<GitError>().getCode()), std::int32_t>);
static_assert(std::is_same_v<decltype(std::declval<GitError>().getErrorClass()), std::int32_t>);
static_assert(std::is_same_v<decltype(std::declval<GitError>().getMessage()), ustring>,
              "the text is given out as a copy");
static_assert(std::is_copy_constructible_v<GitError> && std::is_copy_assignable_v<GitError>);
static_assert(std::is_move_constructible_v<GitError> && std::is_move_assignable_v<GitError>);
static_assert(std::is_constructible_v<GitError, int>);

class GitErrorTest : public testing::Test
{
    const test::HermeticLibGit2 libgit2_{};
};

TEST_F(GitErrorTest, TakesClassAndMessageOfTheRecordForEachCodeButThatOfASuccess)
{
    EXPECT_THAT(makeError(-31, GIT_ERROR_INDEX, "Z\xC3\xBCrich is \xE6\x9D\xB1\xE4\xBA\xAC"),
                isError(-31, GIT_ERROR_INDEX, u"Z\u00FCrich is \u6771\u4EAC"));
    EXPECT_THAT(makeError(1, GIT_ERROR_CALLBACK, "stopped"),
                isError(1, GIT_ERROR_CALLBACK, u"stopped"));
    EXPECT_EQ(
        fl::i18n::ustring_to_utf8(makeError(-1, GIT_ERROR_OS, "no \xFF\xC3 here").getMessage()),
        "no \xFF\xC3 here");
    EXPECT_THAT(makeError(0, GIT_ERROR_NET, "stale"), isError(0, 0, u""));
    EXPECT_STREQ(git_error_last()->message, "stale");
    EXPECT_THAT(GitError(), isError(0, 0, u""));
    git_error_clear();
    EXPECT_THAT(GitError(-5), isError(-5, 0, u""));
}

TEST_F(GitErrorTest, TellsWhatLibGit2SaidOfAFailingCall)
{
    git_repository *repository = nullptr;
    const GitError error(git_repository_open(&repository, "/nowhere/at/all"));
    EXPECT_THAT(error, isError(GIT_ENOTFOUND, git_error_last()->klass,
                               fl::i18n::utf8_to_ustring(git_error_last()->message)));
    EXPECT_NE(error.getMessage(), ustring());
}

TEST_F(GitErrorTest, IsAPlainValue)
{
    const auto isThis = isError(-2, GIT_ERROR_TREE, u"a text that is too long for a small string");
    GitError original = makeError(-2, GIT_ERROR_TREE, "a text that is too long for a small string");
    const GitError copy = original;
    original = GitError();
    EXPECT_EQ(original.getCode(), 0);
    EXPECT_THAT(copy, isThis);
    GitError source = copy;
    EXPECT_THAT(GitError(std::move(source)), isThis);
}

TEST_F(GitErrorTest, HoldsCodeThenClassThenMessage)
{
    const GitError error = makeError(-2, GIT_ERROR_TREE, "text");
    std::array<std::int32_t, 2> words{};
    std::memcpy(words.data(), static_cast<const void *>(&error), sizeof(words));
    EXPECT_EQ(words[0], -2);
    EXPECT_EQ(words[1], GIT_ERROR_TREE);
    EXPECT_EQ(sizeof(GitError), sizeof(words) + sizeof(ustring));
}

} // namespace
} // namespace vclink::git
