// SPDX-License-Identifier: MIT
#include <memory>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "MergeFixture.hpp"
#include "support/text.hpp"

namespace
{

/// An adapter of the host's own, which notes its commits.
class NotingAdapter : public vclink::git::GitAdapter
{
  public:
    using GitAdapter::GitAdapter;
    void commit(const upath &path, const ustring &message) override
    {
        EXPECT_EQ(path.string(), ustring());
        EXPECT_TRUE(path.native());
        messages.push_back(vclink::test::asUtf8(message));
        GitAdapter::commit(path, message);
    }

    std::vector<std::string> messages;
};

/// What a merge commit says.
class MergeCommit : public vclink::test::MergeFixture
{
};

TEST_F(MergeCommit, NamesTheBranchInItsMessage)
{
    diverge(writing("ours", "x"), writing("theirs", "x"));
    merge("topic");
    EXPECT_EQ(message(), "Merge branch 'topic'");
}

TEST_F(MergeCommit, NamesWhateverIsAReferenceAsABranch)
{
    diverge(writing("ours", "x"), writing("theirs", "x"));
    repository_.git({"tag", "light", "topic"});
    repository_.git({"update-ref", "refs/remotes/origin/topic", "topic"});
    const std::string base = idOf("main");
    for (const std::string name : {"light", "origin/topic", "refs/heads/topic"})
    {
        merge(name);
        EXPECT_EQ(message(), "Merge branch '" + name + "'");
        repository_.git({"reset", "--quiet", "--hard", base});
    }
}

TEST_F(MergeCommit, NamesTheCommitInItsMessage)
{
    diverge(writing("ours", "x"), writing("theirs", "x"));
    const std::string base = idOf("main");
    for (const std::string &name :
         {idOf("topic"), idOf("topic").substr(0, 8), std::string("topic^0")})
    {
        merge(name);
        EXPECT_EQ(message(), "Merge commit '" + name + "'");
        repository_.git({"reset", "--quiet", "--hard", base});
    }
}

TEST_F(MergeCommit, NamesABranchThatIsNoAsciiOrNoUtf8)
{
    diverge(writing("ours", "x"), writing("theirs", "x"));
    const std::string base = idOf("main");
    for (const std::string name : {"gr\xC3\xBC\xC3\x9F/\xF0\x9F\x8C\xB3", "caf\xE9"})
    {
        repository_.git({"branch", name, "topic"});
        merge(name);
        EXPECT_EQ(message(), "Merge branch '" + name + "'");
        repository_.git({"reset", "--quiet", "--hard", base});
    }
}

TEST_F(MergeCommit, IsMadeByTheAdaptersOwnOperation)
{
    diverge(writing("ours", "x"), writing("theirs", "x"));
    NotingAdapter adapter(vclink::test::asPath(repository_.path()),
                          std::static_pointer_cast<vclink::ApplicationInteractor>(interactor_));
    vclink::git::BranchManager::create(adapter)->merge("topic");
    EXPECT_EQ(adapter.messages, std::vector<std::string>{"Merge branch 'topic'"});
    EXPECT_EQ(message(), "Merge branch 'topic'");
}

TEST_F(MergeCommit, IsCommittedByThePersonOfTheConfiguration)
{
    diverge(writing("ours", "x"), writing("theirs", "x"));
    merge("topic");
    EXPECT_EQ(repository_.line({"log", "-1", "--format=%an <%ae> %cn <%ce>"}),
              "Test Person <person@example.com> Test Person <person@example.com>");
    EXPECT_EQ(repository_.line({"log", "--walk-reflogs", "-1", "--format=%gs"}),
              "commit (merge): Merge branch 'topic'");
}

} // namespace
