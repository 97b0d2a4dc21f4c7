// SPDX-License-Identifier: MIT
#include <chrono>
#include <functional>
#include <future>
#include <memory>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include <gtest/gtest.h>

#include "MergeFixture.hpp"
#include "support/text.hpp"
#include "vclink/git/GitException.hpp"

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
        beforeCommit();
        GitAdapter::commit(path, message);
    }

    std::vector<std::string> messages;
    std::function<void()> beforeCommit = [] {};
};

/// What a merge commit says.
class MergeCommit : public vclink::test::MergeFixture
{
  protected:
    MergeCommit()
    {
        makeDiverged();
    }
};

TEST_F(MergeCommit, NamesWhateverIsAReferenceAsABranchAndAnyOtherRevisionAsACommit)
{
    repository_.git({"-c", "user.name=x", "-c", "user.email=x@y", "tag", "-a", "-m", "m",
                     "annotated", "topic"});
    for (const std::string reference :
         {"refs/tags/light", "refs/remotes/origin/far",
          "refs/heads/gr\xC3\xBC\xC3\x9F/\xF0\x9F\x8C\xB3", "refs/heads/caf\xE9"})
        repository_.git({"update-ref", reference, "topic"});
    const std::string base = idOf("main");
    const std::vector<std::pair<std::string, std::vector<std::string>>> kinds{
        {"branch",
         {"topic", "refs/heads/topic", "light", "origin/far", "gr\xC3\xBC\xC3\x9F/\xF0\x9F\x8C\xB3",
          "caf\xE9"}},
        {"commit",
         {idOf("topic"), idOf("topic").substr(0, 7), "topic^0", "topic^{commit}",
          "annotated^{commit}"}}};
    for (const auto &[kind, names] : kinds)
    {
        for (const auto &name : names)
        {
            SCOPED_TRACE(name);
            merge(name);
            EXPECT_EQ(message(), "Merge " + kind + " '" + name + "'");
            EXPECT_EQ(parents(), (std::vector<std::string>{base, idOf("topic")}));
            repository_.git({"reset", "--quiet", "--hard", base});
        }
    }
}

TEST_F(MergeCommit, IsMadeByTheAdaptersOwnOperation)
{
    NotingAdapter adapter(vclink::test::asPath(repository_.path()),
                          std::static_pointer_cast<vclink::ApplicationInteractor>(interactor_));
    vclink::git::BranchManager::create(adapter)->merge("topic");
    EXPECT_EQ(adapter.messages, std::vector<std::string>{"Merge branch 'topic'"});
    EXPECT_EQ(message(), "Merge branch 'topic'");
}

/// Such as `git status` of a program that has seen the new files.
TEST_F(MergeCommit, WaitsForAnotherProcessThatHoldsTheIndexForAMoment)
{
    NotingAdapter adapter(vclink::test::asPath(repository_.path()),
                          std::static_pointer_cast<vclink::ApplicationInteractor>(interactor_));
    std::future<void> release;
    adapter.beforeCommit = [&]
    {
        repository_.write(".git/index.lock", "");
        release = std::async(std::launch::async,
                             [this]
                             {
                                 std::this_thread::sleep_for(std::chrono::milliseconds(50));
                                 repository_.remove(".git/index.lock");
                             });
    };
    vclink::git::BranchManager::create(adapter)->merge("topic");
    EXPECT_EQ(message(), "Merge branch 'topic'");
    EXPECT_EQ(branches().getRepositoryState(), "Normal");
}

TEST_F(MergeCommit, IsLeftToTheUserIfAnotherProcessKeepsTheIndex)
{
    NotingAdapter adapter(vclink::test::asPath(repository_.path()),
                          std::static_pointer_cast<vclink::ApplicationInteractor>(interactor_));
    adapter.beforeCommit = [this] { repository_.write(".git/index.lock", ""); };
    EXPECT_THROW(vclink::git::BranchManager::create(adapter)->merge("topic"),
                 vclink::git::GitException);
    repository_.remove(".git/index.lock");
    EXPECT_EQ(branches().getRepositoryState(), "Conflicts");
    makeAdapter(repository_.path())->commit(upath(), u"by the user");
    EXPECT_EQ(parents().size(), 2U);
}

TEST_F(MergeCommit, IsCommittedByThePersonOfTheConfiguration)
{
    merge("topic");
    EXPECT_EQ(repository_.line({"log", "-1", "--format=%an <%ae> %cn <%ce>"}),
              "Test Person <person@example.com> Test Person <person@example.com>");
    EXPECT_EQ(repository_.line({"log", "--walk-reflogs", "-1", "--format=%gs"}),
              "commit (merge): Merge branch 'topic'");
}

} // namespace
