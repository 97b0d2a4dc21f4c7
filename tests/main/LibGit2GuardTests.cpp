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
using namespace vclink::test;

class LibGit2GuardTest : public GitFixture
{
  protected:
    const int before_ = countLibGit2Starts();
};

TEST_F(LibGit2GuardTest, CountsAsLibGit2DoesAndMayEndInAnyOrderOnAnyThread)
{
    std::optional<LibGit2Guard> first(std::in_place);
    std::optional<LibGit2Guard> second(std::in_place);
    const auto third = std::make_unique<LibGit2Guard>();
    EXPECT_EQ(countLibGit2Starts(), before_ + 3);
    std::thread([&first] { first.reset(); }).join();
    second.reset();
    EXPECT_EQ(countLibGit2Starts(), before_ + 1);
    git_repository *repository = nullptr;
    EXPECT_EQ(git_repository_open(&repository, makeRepository().path().c_str()), 0);
    git_repository_free(repository);
}

TEST_F(LibGit2GuardTest, IsNeitherCopiedNorMoved)
{
    EXPECT_FALSE(std::is_copy_constructible_v<LibGit2Guard>);
    EXPECT_FALSE(std::is_copy_assignable_v<LibGit2Guard>);
    EXPECT_FALSE(std::is_move_constructible_v<LibGit2Guard>);
    EXPECT_FALSE(std::is_move_assignable_v<LibGit2Guard>);
}

TEST_F(LibGit2GuardTest, StandsInAdaptersAndGeneratorsForTheirLives)
{
    const auto interactor = std::make_shared<TestInteractor>();
    const auto repository = makeRepository();
    repository.write("file", "x");
    const upath root = asPath(repository.path());
    auto adapter = GitAdapterFactory().createAdapterFor(root, interactor);
    EXPECT_EQ(countLibGit2Starts(), before_ + 1);
    auto generator = GitAdapterFactory().createWorkingCopyGenerator(interactor);
    EXPECT_EQ(countLibGit2Starts(), before_ + 2);
    EXPECT_TRUE(GitAdapterFactory().isAdapterFor(root));
    EXPECT_EQ(countLibGit2Starts(), before_ + 2) << "a probe has one for the call";
    EXPECT_EQ(adapter->getFolderStates(root).size(), 1U);
    adapter.reset();
    EXPECT_EQ(countLibGit2Starts(), before_ + 1);
    generator.reset();
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
        const std::string text = asUtf8(exception.GetUnicodeMessageTxt());
        EXPECT_NE(text.find("malformed"), std::string::npos) << text;
    }
}

} // namespace
