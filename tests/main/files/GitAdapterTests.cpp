// SPDX-License-Identifier: MIT
#include <memory>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "main/AdapterFixture.hpp"
#include "main/TestOptionsFactory.hpp"
#include "support/Failure.hpp"
#include "support/LibGit2Session.hpp"
#include "support/text.hpp"
#include "vclink/exception/SourceControlException.hpp"

namespace
{

using vclink::ApplicationInteractor;
using vclink::exception::SourceControlException;
using vclink::git::GitAdapter;
using namespace vclink::test;

using GitAdapterTest = AdapterFixture;

TEST_F(GitAdapterTest, GivesBackTheVeryRootItWasGiven)
{
    for (const std::u16string text : {u"", u"relative/./x", u"/a/../b//", u"/\u00FC\xD800", u"/"})
    {
        for (const bool native : {true, false})
        {
            const upath given(text, native);
            GitAdapter adapter(given, std::static_pointer_cast<ApplicationInteractor>(interactor_));
            EXPECT_NE(&adapter.getRootFolder(), &given);
            EXPECT_EQ(&adapter.getRootFolder(), &adapter.getRootFolder());
            EXPECT_EQ(adapter.getRootFolder().string(), text);
            EXPECT_EQ(adapter.getRootFolder().native(), native);
        }
    }
}

TEST_F(GitAdapterTest, GivesTheRootAfterAnyOperation)
{
    auto repository = makeRepository();
    repository.write("file", "x");
    repository.symlink("repository", "../link");
    const std::string given = (folder() / "link/../link/./").string();
    const auto adapter = makeAdapter(given);
    const upath root = adapter->getRootFolder();
    adapter->getFileStates({asPath(given + "file")});
    adapter->getFileStates({});
    adapter->getFolderStates(root);
    adapter->addFiles({asPath(given + "file")});
    EXPECT_THROW(adapter->addFiles({asPath(given + "file")}), SourceControlException);
    EXPECT_THROW(adapter->commit(root, u"message"), SourceControlException);
    adapter->revertFiles({asPath(given + "file")});
    EXPECT_EQ(asUtf8(adapter->getRootFolder().string()), given);
}

TEST_F(GitAdapterTest, OpensARepositoryOfItsOwnForEachCaller)
{
    const auto repository = makeRepository();
    const auto adapter = makeAdapter(repository.path());
    auto first = adapter->getRepository();
    const auto second = adapter->getRepository();
    ASSERT_NE(first, nullptr);
    EXPECT_NE(first.get(), second.get());
    first.reset();
    EXPECT_EQ(git_repository_workdir(second.get()), repository.path().string() + '/');
}

TEST_F(GitAdapterTest, RaisesWhereItsRepositoryCannotBeOpened)
{
    const auto adapter = makeAdapter(folder() / "missing");
    EXPECT_EQ(failureOf([&] { static_cast<void>(adapter->getRepository()); }).code, GIT_ENOTFOUND);
}

TEST_F(GitAdapterTest, SharesTheFactoryAndTheInteractor)
{
    const auto factory = std::make_shared<TestOptionsFactory>(interactor_);
    const GitAdapter adapter(asPath(folder().path()), factory);
    EXPECT_EQ(factory.use_count(), 2);
    const auto share = adapter.getOptionsFactory();
    EXPECT_EQ(share, factory);
    EXPECT_EQ(factory.use_count(), 3);
    EXPECT_EQ(adapter.getInteractor(), interactor_);
    EXPECT_EQ(adapter.getInteractor(), factory->getInteractor());
    // This test, the factory, the callbacks and the adapter.
    EXPECT_EQ(interactor_.use_count(), 4);
    const auto withDefaults = makeAdapter(folder().path());
    EXPECT_EQ(withDefaults->getOptionsFactory()->getInteractor(), interactor_);
    EXPECT_EQ(withDefaults->getInteractor(), interactor_);
    // The adapter's own share, and the one asked for here.
    EXPECT_EQ(withDefaults->getOptionsFactory().use_count(), 2);
    EXPECT_FALSE(std::is_copy_constructible_v<GitAdapter>);
    EXPECT_FALSE(std::is_copy_assignable_v<GitAdapter>);
}

TEST_F(GitAdapterTest, OwnsOneObjectOfCallbacks)
{
    const auto one = makeAdapter(folder().path());
    const auto other = makeAdapter(folder().path());
    EXPECT_EQ(&one->getCallbacks(), &one->getCallbacks());
    EXPECT_NE(&one->getCallbacks(), &other->getCallbacks());
    EXPECT_EQ(&one->getCallbacks().checkoutCallbacks(), &one->getCallbacks().checkoutCallbacks());
}

TEST_F(GitAdapterTest, AsksTheFactoryForTheOptionsOfEachWalk)
{
    const auto repository = makeRepository();
    const auto factory = std::make_shared<TestOptionsFactory>(interactor_);
    std::vector<long> shares;
    factory->onStatusOptions = [&] { shares.push_back(factory.use_count()); };
    GitAdapter adapter(asPath(repository.path()), factory);
    adapter.getFileStates({});
    adapter.getFileStates({asPath(repository / "file")});
    adapter.getFolderStates(adapter.getRootFolder());
    // Besides the test's and the adapter's, the walk holds a share.
    EXPECT_THAT(shares, testing::ElementsAre(3, 3));
    EXPECT_EQ(factory.use_count(), 2);
}

/// The factory goes when the interactor and the callbacks have gone, and before the guard.
TEST_F(GitAdapterTest, EndsTheGuardLast)
{
    const int before = countLibGit2Starts();
    int startsAtTheFactorysEnd = 0;
    long sharesAtTheFactorysEnd = 0;
    auto interactor = std::make_shared<TestInteractor>();
    auto factory = std::make_shared<TestOptionsFactory>(interactor);
    factory->onDestruction = [&, watched = std::weak_ptr<ApplicationInteractor>(interactor)]
    {
        startsAtTheFactorysEnd = countLibGit2Starts();
        sharesAtTheFactorysEnd = watched.use_count();
    };
    auto adapter = std::make_unique<GitAdapter>(asPath(folder().path()), std::move(factory));
    EXPECT_EQ(interactor.use_count(), 4);
    interactor.reset();
    adapter.reset();
    EXPECT_EQ(startsAtTheFactorysEnd, before + 1);
    // Its own.
    EXPECT_EQ(sharesAtTheFactorysEnd, 1);
    EXPECT_EQ(countLibGit2Starts(), before);
}

} // namespace
