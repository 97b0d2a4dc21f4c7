// SPDX-License-Identifier: MIT
#include <cstddef>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "CommitFixture.hpp"

namespace
{

using testing::ElementsAre;
using testing::MatchesRegex;
using namespace vclink::test;

const std::string identity = R"(Test Person <person@example\.com> [0-9]+ \+0000)";

class CommitMessage : public CommitFixture
{
  protected:
    CommitMessage()
    {
        commit_ = makeAdapter(repository_.path());
    }

    /// The bytes of the message that the commit at HEAD has after one with this text.
    std::string storedAfter(const ustring &message)
    {
        commit_->commit(upath(), message);
        const std::string bytes = repository_.git({"cat-file", "commit", "HEAD"});
        const auto endOfHeader = bytes.find("\n\n");
        header_ = split(bytes.substr(0, endOfHeader));
        return endOfHeader == std::string::npos ? "no message" : bytes.substr(endOfHeader + 2);
    }
    std::unique_ptr<vclink::git::GitAdapter> commit_;
    std::vector<std::string> header_;
};

TEST_F(CommitMessage, StandsBelowAHeaderThatNamesItsEncoding)
{
    const std::string parent = idOf("HEAD");
    EXPECT_EQ(storedAfter(u"message"), "message");
    EXPECT_THAT(header_, ElementsAre("tree " + idOf("HEAD^{tree}"), "parent " + parent,
                                     MatchesRegex("author " + identity),
                                     MatchesRegex("committer " + identity), "encoding UTF-8"));
}

TEST_F(CommitMessage, NamesUtf8WhateverTheConfigurationSays)
{
    repository_.git({"config", "i18n.commitEncoding", "ISO-8859-1"});
    EXPECT_EQ(storedAfter(u"gr\u00FC\u00DFe"), "gr\xC3\xBC\xC3\x9F"
                                               "e");
    EXPECT_EQ(header_.back(), "encoding UTF-8");
}

/// Empty, blank, with comments for git, control characters and what looks like a header.
TEST_F(CommitMessage, IsStoredUntouched)
{
    for (const std::string message :
         {"", " ", "\n\n\n", "  leading and trailing \t \n\n  \n", "without", "with\n",
          "with three\n\n\n", "subject\n# no comment\n\n\n\nafter more blank lines than one\n",
          "one\r\ntwo\rthree\a\x1B[0m\x7F", "tree 0000\nencoding latin1\n\ngpgsig x\n"})
        EXPECT_EQ(storedAfter(asUtf16(message)), message);
}

TEST_F(CommitMessage, IsUtf8WithTheBytesThatLoneSurrogatesStandFor)
{
    const std::vector<std::pair<ustring, std::string>> messages{
        {u"\u00E9\u20AC\uFEFF\uFFFD", "\xC3\xA9\xE2\x82\xAC\xEF\xBB\xBF\xEF\xBF\xBD"},
        {u"\U0001F600 \U0010FFFF", "\xF0\x9F\x98\x80 \xF4\x8F\xBF\xBF"},
        {{u'x', 0xDC80, u'y', 0xDCFF}, "x\x80y\xFF"},
        {{u'x', 0xD800, u'y', 0xDFFF}, "x\xED\xA0\x80y\xED\xBF\xBF"}};
    for (const auto &[message, bytes] : messages)
        EXPECT_EQ(storedAfter(message), bytes);
}

TEST_F(CommitMessage, OfAMebibyteIsWhole)
{
    constexpr std::size_t mebibyte = 1'048'576;
    std::string message;
    while (message.size() < mebibyte)
        message += std::to_string(message.size()) + (message.size() % 7 == 0 ? "\n" : " ");
    message.resize(mebibyte);
    EXPECT_TRUE(storedAfter(asUtf16(message)) == message);
}

/// libgit2 takes texts that end at a NUL. git refuses one in a message.
TEST_F(CommitMessage, EndsAtANul)
{
    EXPECT_EQ(storedAfter({u'a', u'\0', u'b'}), "a");
}

TEST_F(CommitMessage, IsNotTakenFromAMergeUnderWay)
{
    beginMerge({"file"});
    EXPECT_EQ(storedAfter(u"my own"), "my own");
}

} // namespace
