// SPDX-License-Identifier: MIT
#include <sstream>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "TransportFixture.hpp"

namespace
{

using testing::IsEmpty;
using testing::SizeIs;
using vclink::test::allTransports;
using vclink::test::GitRepository;

class RemoteHeads : public vclink::test::TransportFixture
{
  protected:
    RemoteHeads()
    {
        working_.git({"remote", "add", "origin", url_});
    }

    /// What the library lists, in the words of `git ls-remote --symref`.
    std::string listed() const
    {
        std::ostringstream text;
        for (const auto &head : heads(working_))
        {
            if (!head.symrefTarget.empty())
                text << "ref: " << head.symrefTarget << '\t' << head.name << '\n';
            static const char *const digits = "0123456789abcdef";
            for (const unsigned byte : head.oid)
                text << digits[byte / 16] << digits[byte % 16];
            text << '\t' << head.name << '\n';
        }
        return text.str();
    }
    std::string listedByGit() const
    {
        return working_.git({"ls-remote", "--symref", "origin"});
    }

    GitRepository working_ = makeRepository("working");
};

TEST_P(RemoteHeads, OfAnEmptyRepositoryAreNone)
{
    EXPECT_THAT(heads(working_), IsEmpty());
}

TEST_P(RemoteHeads, AreWhatGitLists)
{
    change("file", "first\n");
    source_.git({"tag", "light"});
    source_.git(
        {"-c", "user.name=a", "-c", "user.email=a@example.com", "tag", "-m", "tag", "annotated"});
    source_.git({"branch", "topic/ä"});
    publish({"--all"});
    publish({"--tags"});
    EXPECT_EQ(listed(), listedByGit());
}

TEST_P(RemoteHeads, TellWhatHeadStandsFor)
{
    change("file", "first\n");
    publish({"main", "main:other"});
    served_.git({"symbolic-ref", "HEAD", "refs/heads/other"});
    const auto found = heads(working_);
    ASSERT_THAT(found, testing::Not(IsEmpty()));
    EXPECT_EQ(found.front().name, "HEAD");
    EXPECT_EQ(found.front().symrefTarget, "refs/heads/other");
    for (std::size_t i = 1; i < found.size(); ++i)
        EXPECT_EQ(found[i].symrefTarget, "") << found[i].name;
}

TEST_P(RemoteHeads, OfADetachedHeadHaveNoTarget)
{
    const std::string id = change("file", "first\n");
    publish({"main"});
    served_.git({"update-ref", "--no-deref", "HEAD", id});
    const auto found = heads(working_);
    ASSERT_THAT(found, SizeIs(2));
    EXPECT_EQ(found.front().name, "HEAD");
    EXPECT_EQ(found.front().symrefTarget, "");
}

TEST_P(RemoteHeads, AreFiveThousand)
{
    const std::string id = change("file", "first\n");
    publish({"main"});
    std::string packed = "# pack-refs with: peeled fully-peeled sorted \n";
    for (int i = 10'000; i < 14'998; ++i)
        packed += id + " refs/heads/folder/branch" + std::to_string(i) + "\n";
    served_.write("packed-refs", packed);
    EXPECT_THAT(heads(working_), SizeIs(5000));
    EXPECT_EQ(listed(), listedByGit());
}

INSTANTIATE_TEST_SUITE_P(Over, RemoteHeads, allTransports(), testing::PrintToStringParamName());

} // namespace
