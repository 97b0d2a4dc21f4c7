// SPDX-License-Identifier: MIT
#include <array>
#include <cstdint>
#include <cstring>
#include <type_traits>
#include <utility>

#include <git2.h>
#include <gtest/gtest.h>

#include "error/HermeticLibGit2.hpp"
#include "error/errorUtil/libgit2Errors.hpp"
#include "fl/i18n/convert.hpp"
#include "vclink/git/GitError.hpp"

namespace vclink::git
{
namespace
{

using test::HermeticLibGit2;

static_assert(std::is_same_v<decltype(std::declval<GitError>().getCode()), std::int32_t>);
static_assert(std::is_same_v<decltype(std::declval<GitError>().getErrorClass()), std::int32_t>);
static_assert(std::is_same_v<decltype(std::declval<GitError>().getMessage()), ustring>,
              "the text is given out as a copy");
static_assert(std::is_copy_constructible_v<GitError> && std::is_copy_assignable_v<GitError>);
static_assert(std::is_move_constructible_v<GitError> && std::is_move_assignable_v<GitError>);
static_assert(std::is_constructible_v<GitError, int>);

void expectNoDetail(const GitError &error)
{
    EXPECT_EQ(error.getErrorClass(), 0);
    EXPECT_EQ(error.getMessage(), ustring());
}

TEST(GitError, IsNoFailureWhenDefaultMade)
{
    const GitError error;
    EXPECT_EQ(error.getCode(), 0);
    expectNoDetail(error);
}

TEST(GitError, TakesClassAndMessageOfTheRecord)
{
    const HermeticLibGit2 libgit2;
    git_error_set_str(GIT_ERROR_INDEX, "Z\xC3\xBCrich is \xE6\x9D\xB1\xE4\xBA\xAC");
    const GitError error(-31);
    EXPECT_EQ(error.getCode(), -31);
    EXPECT_EQ(error.getErrorClass(), GIT_ERROR_INDEX);
    EXPECT_EQ(error.getMessage(), u"Z\u00FCrich is \u6771\u4EAC");
}

TEST(GitError, TellsWhatLibGit2SaidOfAFailingCall)
{
    const HermeticLibGit2 libgit2;
    git_repository *repository = nullptr;
    const GitError error(git_repository_open(&repository, "/nowhere/at/all"));
    EXPECT_EQ(error.getCode(), GIT_ENOTFOUND);
    EXPECT_EQ(error.getErrorClass(), git_error_last()->klass);
    EXPECT_EQ(error.getMessage(), fl::i18n::utf8_to_ustring(git_error_last()->message));
    EXPECT_NE(error.getMessage(), ustring());
}

TEST(GitError, OfASuccessIgnoresTheRecordOfAnEarlierFailure)
{
    const HermeticLibGit2 libgit2;
    git_error_set_str(GIT_ERROR_NET, "stale");
    const GitError error(0);
    EXPECT_EQ(error.getCode(), 0);
    expectNoDetail(error);
    EXPECT_STREQ(git_error_last()->message, "stale");
}

TEST(GitError, WithoutARecordHasNothingButItsCode)
{
    const HermeticLibGit2 libgit2;
    git_error_clear();
    const GitError error(-5);
    EXPECT_EQ(error.getCode(), -5);
    expectNoDetail(error);
}

TEST(GitError, OfAPositiveCodeReadsTheRecordToo)
{
    const HermeticLibGit2 libgit2;
    git_error_set_str(GIT_ERROR_CALLBACK, "stopped");
    const GitError error(1);
    EXPECT_EQ(error.getCode(), 1);
    EXPECT_EQ(error.getErrorClass(), GIT_ERROR_CALLBACK);
    EXPECT_EQ(error.getMessage(), u"stopped");
}

TEST(GitError, KeepsAMessageThatIsNotUtf8)
{
    const HermeticLibGit2 libgit2;
    git_error_set_str(GIT_ERROR_OS, "no \xFF\xC3 here");
    EXPECT_EQ(fl::i18n::ustring_to_utf8(GitError(-1).getMessage()), "no \xFF\xC3 here");
}

TEST(GitError, IsAPlainValue)
{
    const HermeticLibGit2 libgit2;
    git_error_set_str(GIT_ERROR_TREE, "a text that is too long for a small string");
    GitError original(-2);
    const GitError copy = original;
    original = GitError();
    EXPECT_EQ(original.getCode(), 0);
    EXPECT_EQ(copy.getCode(), -2);
    EXPECT_EQ(copy.getErrorClass(), GIT_ERROR_TREE);

    GitError source = copy;
    const GitError moved = std::move(source);
    EXPECT_EQ(moved.getCode(), -2);
    EXPECT_EQ(moved.getMessage(), u"a text that is too long for a small string");
}

TEST(GitError, HoldsCodeThenClassThenMessage)
{
    const HermeticLibGit2 libgit2;
    git_error_set_str(GIT_ERROR_TREE, "text");
    const GitError error(-2);
    std::array<std::int32_t, 2> words{};
    std::memcpy(words.data(), static_cast<const void *>(&error), sizeof(words));
    EXPECT_EQ(words[0], -2);
    EXPECT_EQ(words[1], GIT_ERROR_TREE);
    EXPECT_EQ(sizeof(GitError), sizeof(words) + sizeof(ustring));
}

} // namespace
} // namespace vclink::git
