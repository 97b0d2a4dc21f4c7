// SPDX-License-Identifier: MIT
#include <string>

#include <git2/errors.h>
#include <gtest/gtest.h>

#include "HermeticLibGit2.hpp"
#include "error/errorUtil/gitString.hpp"
#include "support/Failure.hpp"
#include "support/text.hpp"

namespace
{

using vclink::git::asGitString;
using vclink::git::refuseNul;
using vclink::git::toGitString;
using namespace vclink::test;

class GitString : public testing::Test
{
  private:
    HermeticLibGit2 libGit2_;
};

TEST_F(GitString, IsTheTextItself)
{
    for (const std::string text : {"", "main", "a b\n\t\x01", "\xC3\xBC", "\xFF\xFE"})
    {
        EXPECT_EQ(asGitString(text), text.c_str());
        EXPECT_EQ(toGitString(asUtf16(text)), text);
        EXPECT_NO_THROW(refuseNul(text));
    }
}

TEST_F(GitString, IsNoTextWithANulAnywhere)
{
    const struct
    {
        std::string text;
        const char *shown;
    } rows[] = {{std::string(1, '\0'), "\\0"},
                {std::string("main\0", 5), "main\\0"},
                {std::string("main\0x", 6), "main\\0x"},
                {std::string("\0main", 5), "\\0main"},
                {std::string("a\0\0b\0", 5), "a\\0\\0b\\0"},
                {std::string("\xC3\xBC\0", 3), "\xC3\xBC\\0"}};
    for (const auto &row : rows)
    {
        const Failure refusal{GIT_EINVALIDSPEC, GIT_ERROR_INVALID,
                              std::string("'") + row.shown + "' contains a NUL character"};
        EXPECT_EQ(failureOf([&row] { refuseNul(row.text); }), refusal);
        EXPECT_EQ(failureOf([&row] { asGitString(row.text); }), refusal);
        EXPECT_EQ(failureOf([&row] { toGitString(asUtf16(row.text)); }), refusal);
    }
}

} // namespace
