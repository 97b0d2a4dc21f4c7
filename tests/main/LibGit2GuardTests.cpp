// SPDX-License-Identifier: MIT
#include <memory>
#include <optional>
#include <thread>
#include <type_traits>

#include <git2.h>
#include <gtest/gtest.h>

#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/TestInteractor.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/LibGit2Exception.hpp"
#include "vclink/git/LibGit2Guard.hpp"

namespace
{

using vclink::git::GitAdapterFactory;
using vclink::git::LibGit2Exception;
using vclink::git::LibGit2Guard;
using vclink::test::asPath;
using vclink::test::countLibGit2Starts;

class LibGit2GuardTest : public vclink::test::GitFixture
{
  protected:
    const int before_ = countLibGit2Starts();
};

TEST_F(LibGit2GuardTest, KeepsLibGit2AliveForItsLife)
{
    {
        const LibGit2Guard guard;
        EXPECT_EQ(countLibGit2Starts(), before_ + 1);
    }
    EXPECT_EQ(countLibGit2Starts(), before_);
}

TEST_F(LibGit2GuardTest, NestsByLibGit2sOwnCount)
{
    const LibGit2Guard outer;
    {
        const LibGit2Guard inner;
        const LibGit2Guard innermost;
        EXPECT_EQ(countLibGit2Starts(), before_ + 3);
    }
    EXPECT_EQ(countLibGit2Starts(), before_ + 1);
}

TEST_F(LibGit2GuardTest, MayEndInAnyOrder)
{
    std::optional<LibGit2Guard> first(std::in_place);
    std::optional<LibGit2Guard> second(std::in_place);
    first.reset();
    EXPECT_EQ(countLibGit2Starts(), before_ + 1);
    git_repository *repository = nullptr;
    EXPECT_EQ(git_repository_open(&repository, makeRepository().path().c_str()), 0);
    git_repository_free(repository);
    second.reset();
    EXPECT_EQ(countLibGit2Starts(), before_);
}

TEST_F(LibGit2GuardTest, IsNeitherCopiedNorMoved)
{
    EXPECT_FALSE(std::is_copy_constructible_v<LibGit2Guard>);
    EXPECT_FALSE(std::is_copy_assignable_v<LibGit2Guard>);
    EXPECT_FALSE(std::is_move_constructible_v<LibGit2Guard>);
    EXPECT_FALSE(std::is_move_assignable_v<LibGit2Guard>);
}

TEST_F(LibGit2GuardTest, MayEndOnAnotherThread)
{
    auto guard = std::make_unique<LibGit2Guard>();
    std::thread([&guard] { guard.reset(); }).join();
    EXPECT_EQ(countLibGit2Starts(), before_);
}

TEST_F(LibGit2GuardTest, StandsInAnAdapterForTheAdaptersLife)
{
    const auto interactor = std::make_shared<vclink::test::TestInteractor>();
    auto adapter = GitAdapterFactory().createAdapterFor(asPath(folder().path()), interactor);
    EXPECT_EQ(countLibGit2Starts(), before_ + 1);
    auto second = GitAdapterFactory().createAdapterFor(asPath(folder().path()), interactor);
    EXPECT_EQ(countLibGit2Starts(), before_ + 2);
    adapter.reset();
    EXPECT_EQ(countLibGit2Starts(), before_ + 1);
    second.reset();
    EXPECT_EQ(countLibGit2Starts(), before_);
}

TEST_F(LibGit2GuardTest, StandsInAProbeForTheCallOnly)
{
    const auto repository = makeRepository();
    repository.write("broken/.git", "neither a folder nor a link");
    const GitAdapterFactory factory;
    EXPECT_TRUE(factory.isAdapterFor(asPath(repository.path())));
    EXPECT_EQ(countLibGit2Starts(), before_);
    EXPECT_FALSE(factory.isAdapterFor(asPath(folder().path())));
    EXPECT_EQ(countLibGit2Starts(), before_);
    EXPECT_THROW(factory.isAdapterFor(asPath(repository / "broken")), LibGit2Exception);
    EXPECT_EQ(countLibGit2Starts(), before_);
}

TEST_F(LibGit2GuardTest, LetsAnExceptionOfAProbeTellItsTextAfterTheEnd)
{
    const auto repository = makeRepository();
    repository.write("broken/.git", "neither a folder nor a link");
    try
    {
        GitAdapterFactory().isAdapterFor(asPath(repository / "broken"));
        FAIL() << "no exception";
    }
    catch (const LibGit2Exception &exception)
    {
        EXPECT_EQ(countLibGit2Starts(), before_);
        const std::string text = vclink::test::asUtf8(exception.GetUnicodeMessageTxt());
        EXPECT_NE(text.find("malformed"), std::string::npos) << text;
    }
}

TEST_F(LibGit2GuardTest, StandsInAGeneratorForItsLife)
{
    const auto interactor = std::make_shared<vclink::test::TestInteractor>();
    auto generator = GitAdapterFactory().createWorkingCopyGenerator(interactor);
    EXPECT_EQ(countLibGit2Starts(), before_ + 1);
    generator.reset();
    EXPECT_EQ(countLibGit2Starts(), before_);
}

TEST_F(LibGit2GuardTest, KeepsAnAdapterWorkingWhenAProbeHasEnded)
{
    const auto repository = makeRepository();
    repository.write("file", "x");
    const auto interactor = std::make_shared<vclink::test::TestInteractor>();
    const upath root = asPath(repository.path());
    const auto adapter = GitAdapterFactory().createAdapterFor(root, interactor);
    EXPECT_TRUE(GitAdapterFactory().isAdapterFor(root));
    EXPECT_EQ(adapter->getFolderStates(root).size(), 1U);
}

} // namespace
