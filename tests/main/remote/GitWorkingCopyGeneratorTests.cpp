// SPDX-License-Identifier: MIT
#include "vclink/git/GitWorkingCopyGenerator.hpp"

#include <memory>
#include <stdexcept>
#include <string>
#include <type_traits>
#include <utility>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "CloneFixture.hpp"
#include "error/VirtualTable.hpp"
#include "error/logging/severity.hpp"
#include "main/TestOptionsFactory.hpp"
#include "support/LibGit2Session.hpp"
#include "support/LogCapture.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

namespace git = vclink::git;
using testing::IsEmpty;
using namespace vclink::test;

using Generator = git::GitWorkingCopyGenerator;
static_assert(std::is_base_of_v<vclink::WorkingCopyGenerator, Generator>);
static_assert(!std::is_copy_constructible_v<Generator> && !std::is_copy_assignable_v<Generator>);

const std::string generateSignature =
    "virtual void vclink::git::GitWorkingCopyGenerator::generate(const ustring&, const upath&)";

using GeneratorObject = CloneFixture;

/// Clones of a repository on this machine, named either way.
class Clone : public CloneFixture, public testing::WithParamInterface<Naming>
{
  protected:
    Clone() : CloneFixture(GetParam())
    {
    }
};

TEST_F(GeneratorObject, HasItsOperationBehindTheDestructor)
{
    EXPECT_EQ(slotOf(&Generator::generate), 2U);
    EXPECT_NE(dynamic_cast<Generator *>(&generator()), nullptr) << "of the factory";
}

TEST_F(GeneratorObject, TakesSharesOfTheInteractorAndReleasesThem)
{
    auto interactor = std::make_shared<TestInteractor>();
    const std::weak_ptr<vclink::ApplicationInteractor> watched = interactor;
    auto made = git::GitAdapterFactory().createWorkingCopyGenerator(std::move(interactor));
    // The options factory and the callbacks.
    EXPECT_EQ(watched.use_count(), 2);
    made.reset();
    EXPECT_TRUE(watched.expired());
}

TEST_F(GeneratorObject, StartsLibGit2FirstAndStopsItLast)
{
    const int before = countLibGit2Starts();
    int startsAtTheFactorysEnd = 0;
    long sharesAtTheFactorysEnd = 0;
    auto interactor = std::make_shared<TestInteractor>();
    auto factory = std::make_unique<TestOptionsFactory>(interactor);
    factory->onDestruction = [&]
    {
        startsAtTheFactorysEnd = countLibGit2Starts();
        sharesAtTheFactorysEnd = interactor.use_count();
    };
    auto made = std::make_unique<Generator>(std::unique_ptr<git::GitOptionsFactory>(
        std::unique_ptr<TestOptionsFactory>(std::move(factory))));
    EXPECT_EQ(countLibGit2Starts(), before + 1);
    EXPECT_EQ(interactor.use_count(), 3);
    made.reset();
    EXPECT_EQ(startsAtTheFactorysEnd, before + 1);
    EXPECT_EQ(sharesAtTheFactorysEnd, 2) << "the callbacks go before the factory";
    EXPECT_EQ(countLibGit2Starts(), before);
}

TEST_F(GeneratorObject, AsksItsFactoryForTheOptionsOfEachClone)
{
    author_.git({"push", "--quiet", "server", "main:gr\xC3\xBC\xC3\x9F"});
    auto factory = std::make_unique<TestOptionsFactory>(interactor_);
    git::CloneOptions &options = factory->cloneOptions;
    options.checkoutBranch = "gr\xC3\xBC\xC3\x9F";
    int asked = 0;
    factory->onCloneOptions = [&] { options.bare = ++asked == 2; };
    Generator made(std::unique_ptr<git::GitOptionsFactory>(std::move(factory)));
    made.generate(asUtf16(nameOf(server_)), asPath(clone_.path()));
    EXPECT_EQ(clone_.line({"symbolic-ref", "HEAD"}), "refs/heads/gr\xC3\xBC\xC3\x9F");
    EXPECT_EQ(clone_.line({"rev-parse", "--is-bare-repository"}), "false");
    made.generate(asUtf16(nameOf(server_)), asPath(folder() / "second"));
    EXPECT_EQ(asked, 2);
    EXPECT_EQ(GitRepository(folder() / "second").line({"rev-parse", "--is-bare-repository"}),
              "true");
}

TEST_F(GeneratorObject, RaisesWhatItsFactoryRaisesAndMakesNothing)
{
    auto factory = std::make_unique<TestOptionsFactory>(interactor_);
    factory->onCloneOptions = [] { throw std::runtime_error("no options"); };
    Generator made(std::unique_ptr<git::GitOptionsFactory>(std::move(factory)));
    EXPECT_THROW(made.generate(asUtf16(nameOf(server_)), asPath(clone_.path())),
                 std::runtime_error);
    EXPECT_FALSE(std::filesystem::exists(clone_.path()));
}

TEST_P(Clone, IsThatOfGit)
{
    author_.git({"push", "--quiet", "server", "main:feature/other"});
    author_.git({"tag", "light"});
    author_.git({"push", "--quiet", "server", "light"});
    generate();
    expectCloned(clone_);
    const auto expected = GitRepository::clone(nameOf(server_), folder() / "by git");
    auto byGit = references(expected);
    auto own = references(clone_);
    EXPECT_EQ(own, byGit);
    EXPECT_EQ(indexOf(clone_), indexOf(expected));
    for (const std::string key : {"remote.origin.url", "remote.origin.fetch", "branch.main.remote",
                                  "branch.main.merge", "core.bare"})
        EXPECT_EQ(clone_.line({"config", key}), expected.line({"config", key})) << key;
}

TEST_P(Clone, IsMadeAsOftenAsAsked)
{
    generate();
    publish("later", "z");
    generate(nameOf(server_), folder() / "second");
    expectCloned(GitRepository(folder() / "second"));
    EXPECT_FALSE(std::filesystem::exists(clone_ / "later"));
}

TEST_P(Clone, OfAnEmptyRepositoryIsEmpty)
{
    server_.git({"update-ref", "-d", "refs/heads/main"});
    generate();
    EXPECT_THAT(references(clone_), IsEmpty());
    EXPECT_FALSE(clone_.tryGit({"rev-parse", "--verify", "--quiet", "HEAD"}).succeeded());
    EXPECT_EQ(clone_.git({"status", "--porcelain"}), "");
    EXPECT_EQ(clone_.line({"config", "remote.origin.url"}), nameOf(server_));
}

TEST_P(Clone, ShowsTheProgressOfItsCheckoutAndIsNotDisturbedByADisplayThatRaises)
{
    auto &progress = interactor_->progress;
    generate();
    ASSERT_FALSE(progress.fractions.empty());
    EXPECT_EQ(progress.fractions.back(), 1.0);
    EXPECT_EQ(progress.messages.size(), 5U);
    progress.onCall = [](std::size_t) { throw std::runtime_error("no display"); };
    generate(nameOf(server_), folder() / "second");
    expectCloned(GitRepository(folder() / "second"));
}

TEST_P(Clone, IsTracedWithItsParameters)
{
    const LogCapture log(git::SeverityScopeEntry | git::SeverityParameter | git::SeverityScopeExit |
                         git::SeverityDiagnostic | git::SeverityException);
    generate();
    EXPECT_THAT(log.messages(git::SeverityDiagnostic), IsEmpty());
    EXPECT_THAT(log.messages(git::SeverityException), IsEmpty());
    const auto records = log.records();
    ASSERT_GE(records.size(), 3U);
    EXPECT_EQ(records[0].message, generateSignature);
    EXPECT_EQ(records[0].severity, git::SeverityScopeEntry);
    EXPECT_EQ(records[1].message, " repositorySpecifier=" + nameOf(server_) +
                                      " sandboxRoot.string()=" + clone_.path().string());
    EXPECT_EQ(records[1].severity, git::SeverityParameter);
    EXPECT_EQ(records.back().message, generateSignature);
    EXPECT_EQ(records.back().severity, git::SeverityScopeExit);
}

TEST_P(Clone, IsTracedWithItsFailure)
{
    const LogCapture log(git::SeverityScopeEntry | git::SeverityScopeExit);
    EXPECT_THROW(generate("file:///nowhere/gr\xC3\xBC\xC3\x9F", clone_.path()),
                 git::LibGit2Exception);
    EXPECT_EQ(log.messages().front(), generateSignature);
    EXPECT_EQ(log.messages().back(), generateSignature + " [throw]");
}

INSTANTIATE_TEST_SUITE_P(Locally, Clone, testing::Values(Naming::PlainPath, Naming::FileUrl));

} // namespace
