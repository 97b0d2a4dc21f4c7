// SPDX-License-Identifier: MIT
#include <memory>
#include <string>

#include <git2.h>
#include <gtest/gtest.h>

#include "AdapterFixture.hpp"
#include "support/libgit2Release.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

using vclink::ApplicationInteractor;
using vclink::git::GitAdapterFactory;
using vclink::git::LibGit2Exception;
using namespace vclink::test;

class GitAdapterFactoryTest : public AdapterFixture
{
  protected:
    std::unique_ptr<vclink::CMAdapter> create(const upath &root) const
    {
        return GitAdapterFactory().createAdapterFor(root, interactor_);
    }
};

TEST_F(GitAdapterFactoryTest, ServesTheHostThroughItsInterface)
{
    auto repository = makeRepository();
    repository.write("file", "x");
    const GitAdapterFactory factory;
    const vclink::CMAdapterFactory &seen = factory;
    EXPECT_EQ(seen.getName(), u"git");
    ASSERT_TRUE(seen.isAdapterFor(asPath(repository.path())));
    const auto adapter = seen.createAdapterFor(asPath(repository.path()), interactor_);
    EXPECT_NE(dynamic_cast<vclink::git::GitAdapter *>(adapter.get()), nullptr);
    EXPECT_EQ(adapter->getFolderStates(adapter->getRootFolder()).size(), 1U);
}

TEST_F(GitAdapterFactoryTest, MakesAnAdapterForAFolderThatIsARepositoryOnlyLater)
{
    const upath root = asPath(folder() / "later");
    const auto adapter = create(root);
    ASSERT_NE(adapter, nullptr);
    EXPECT_EQ(asUtf8(adapter->getRootFolder().string()), (folder() / "later").string());
    EXPECT_THROW(adapter->getFolderStates(root), LibGit2Exception);
    EXPECT_THROW(adapter->getFolderStates(root), LibGit2Exception);
    makeRepository("later").write("file", "x");
    EXPECT_EQ(adapter->getFolderStates(root).size(), 1U);
}

TEST_F(GitAdapterFactoryTest, LetsTheFirstOperationRaiseForAFolderThatIsNoRepository)
{
    const upath home = asPath(environment().home());
    const auto adapter = create(home);
    try
    {
        adapter->getFolderStates(home);
        FAIL() << "no exception";
    }
    catch (const LibGit2Exception &exception)
    {
        EXPECT_EQ(exception.getError().getCode(), GIT_ENOTFOUND);
        EXPECT_EQ(exception.getError().getErrorClass(), GIT_ERROR_REPOSITORY);
        const std::string own = asUtf8(exception.getError().getMessage());
        EXPECT_EQ(own, "could not find repository " +
                           std::string(libgit2_release::whereNoRepositoryIs) + " '" +
                           environment().home().string() + "'");
        const std::string text = asUtf8(exception.GetUnicodeMessageTxt());
        EXPECT_NE(text.find(own), std::string::npos) << text;
        EXPECT_NE(text.find("-3"), std::string::npos) << text;
        EXPECT_EQ(exception.GetID(), "shared_vclink:git:LibGit2Error");
    }
    EXPECT_EQ(adapter->getRootFolder(), home);
}

TEST_F(GitAdapterFactoryTest, TakesAShareOfTheInteractorAndLetsTheArgumentGo)
{
    const std::weak_ptr<ApplicationInteractor> watched = interactor_;
    std::shared_ptr<ApplicationInteractor> argument = interactor_;
    auto adapter =
        GitAdapterFactory().createAdapterFor(asPath(folder().path()), std::move(argument));
    EXPECT_EQ(argument, nullptr);
    // The options factory, the callbacks and the adapter have one each.
    EXPECT_EQ(watched.use_count(), 1 + 3);
    interactor_.reset();
    EXPECT_FALSE(watched.expired());
    adapter.reset();
    EXPECT_TRUE(watched.expired());
}

} // namespace
