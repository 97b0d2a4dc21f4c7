// SPDX-License-Identifier: MIT
// The life of the merge driver's registration, seen through merges.
#include <memory>
#include <optional>
#include <string>
#include <thread>

#include <git2.h>
#include <git2/sys/merge.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "AdapterFixture.hpp"
#include "support/LogCapture.hpp"
#include "support/text.hpp"
#include "vclink/WorkingCopyGenerator.hpp"
#include "vclink/exception/SourceControlException.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/GitConfig.hpp"
#include "vclink/git/LibGit2Exception.hpp"
#include "vclink/git/LibGit2Guard.hpp"

namespace
{

using vclink::git::BranchManager;
using vclink::git::GitAdapterFactory;
using vclink::git::LibGit2Guard;
using vclink::test::asPath;
using vclink::test::GitRepository;

bool isRegistered()
{
    return git_merge_driver_lookup("*") != nullptr;
}

class GuardRegistration : public vclink::test::AdapterFixture
{
  protected:
    GuardRegistration()
    {
        repository_.git({"config", "user.name", "Test Author"});
        repository_.git({"config", "user.email", "author@example.com"});
        repository_.git({"config", "merge.tool.driver", "cp %B %A"});
        repository_.write(".gitattributes", "file merge=tool\n");
        repository_.write("file", "base\n");
        repository_.commitAll("base");
        repository_.git({"checkout", "--quiet", "-b", "theirs"});
        repository_.write("file", "theirs\n");
        repository_.commitAll("theirs");
        repository_.git({"checkout", "--quiet", "main"});
        repository_.write("file", "ours\n");
        repository_.commitAll("ours");
    }

    /// Whether a merge by an adapter that stands already runs the command; without it the file
    /// stays in conflict. The repository is then as before.
    bool runsTheCommand(vclink::git::GitAdapter &adapter) const
    {
        const std::string before = repository_.line({"rev-parse", "HEAD"});
        try
        {
            BranchManager::create(adapter)->merge("theirs");
            EXPECT_EQ(repository_.read("file"), "theirs\n");
            repository_.git({"reset", "--quiet", "--hard", before});
            return true;
        }
        catch (const vclink::exception::SourceControlException &)
        {
            EXPECT_NE(repository_.git({"ls-files", "--unmerged"}), "");
            repository_.git({"reset", "--quiet", "--hard", before});
            return false;
        }
    }
    std::unique_ptr<vclink::git::GitAdapter> newAdapter() const
    {
        return makeAdapter(repository_.path());
    }

    GitRepository repository_ = makeRepository();
};

TEST_F(GuardRegistration, StandsForTheLifeOfTheOnlyGuard)
{
    EXPECT_FALSE(isRegistered());
    {
        const LibGit2Guard guard;
        EXPECT_TRUE(isRegistered());
    }
    EXPECT_FALSE(isRegistered());
}

TEST_F(GuardRegistration, LetsTheMergesOfAnAdapterRunTheCommand)
{
    const auto adapter = newAdapter();
    EXPECT_TRUE(runsTheCommand(*adapter));
    EXPECT_TRUE(runsTheCommand(*adapter));
}

TEST_F(GuardRegistration, IsLostWithAnInnerGuardAndRegainedWithTheNext)
{
    const auto adapter = newAdapter();
    {
        const LibGit2Guard inner;
        EXPECT_TRUE(runsTheCommand(*adapter));
    }
    EXPECT_FALSE(isRegistered());
    EXPECT_FALSE(runsTheCommand(*adapter));
    {
        const LibGit2Guard next;
        EXPECT_TRUE(runsTheCommand(*adapter));
    }
    EXPECT_FALSE(runsTheCommand(*adapter));
}

TEST_F(GuardRegistration, IsLostWithTheOuterGuardToo)
{
    std::optional<LibGit2Guard> outer(std::in_place);
    const auto adapter = newAdapter();
    EXPECT_TRUE(runsTheCommand(*adapter));
    outer.reset();
    EXPECT_FALSE(runsTheCommand(*adapter));
}

TEST_F(GuardRegistration, StandsAgainForGuardsOneAfterTheOther)
{
    for (int i = 0; i < 3; ++i)
    {
        const auto adapter = newAdapter();
        EXPECT_TRUE(runsTheCommand(*adapter)) << i;
    }
    EXPECT_FALSE(isRegistered());
}

TEST_F(GuardRegistration, IsLostWithAProbeInTheMiddleOfAnAdaptersLife)
{
    const auto adapter = newAdapter();
    EXPECT_TRUE(runsTheCommand(*adapter));
    EXPECT_TRUE(GitAdapterFactory().isAdapterFor(asPath(repository_.path())));
    EXPECT_FALSE(runsTheCommand(*adapter));
    const auto second = newAdapter();
    EXPECT_TRUE(runsTheCommand(*adapter));
    EXPECT_TRUE(runsTheCommand(*second));
}

TEST_F(GuardRegistration, IsLostWithAProbeThatSaysNoOrFails)
{
    repository_.write("broken/.git", "neither a folder nor a link");
    auto adapter = newAdapter();
    EXPECT_FALSE(GitAdapterFactory().isAdapterFor(asPath(folder() / "missing")));
    EXPECT_FALSE(runsTheCommand(*adapter));
    adapter = newAdapter();
    // The new adapter stood before the old one went.
    EXPECT_FALSE(isRegistered());
    adapter.reset();
    adapter = newAdapter();
    EXPECT_TRUE(isRegistered());
    EXPECT_THROW(GitAdapterFactory().isAdapterFor(asPath(repository_ / "broken")),
                 vclink::git::LibGit2Exception);
    EXPECT_FALSE(isRegistered());
}

TEST_F(GuardRegistration, IsLostWithASecondAdapter)
{
    const auto adapter = newAdapter();
    auto second = newAdapter();
    EXPECT_TRUE(runsTheCommand(*second));
    second.reset();
    EXPECT_FALSE(runsTheCommand(*adapter));
}

TEST_F(GuardRegistration, IsLostWithAnObjectForTheConfiguration)
{
    const auto adapter = newAdapter();
    {
        const vclink::git::GitConfig config;
        EXPECT_TRUE(runsTheCommand(*adapter));
    }
    EXPECT_FALSE(runsTheCommand(*adapter));
}

TEST_F(GuardRegistration, IsLostWithAGenerator)
{
    const auto adapter = newAdapter();
    {
        const auto generator = GitAdapterFactory().createWorkingCopyGenerator(interactor_);
        EXPECT_TRUE(runsTheCommand(*adapter));
    }
    EXPECT_FALSE(isRegistered());
    EXPECT_FALSE(runsTheCommand(*adapter));
    const auto next = GitAdapterFactory().createWorkingCopyGenerator(interactor_);
    EXPECT_TRUE(runsTheCommand(*adapter));
}

TEST_F(GuardRegistration, IsLostAndRegainedByGuardsOfAnotherThread)
{
    const auto adapter = newAdapter();
    std::unique_ptr<LibGit2Guard> guard;
    std::thread([&guard] { guard = std::make_unique<LibGit2Guard>(); }).join();
    EXPECT_TRUE(runsTheCommand(*adapter));
    std::thread([&guard] { guard.reset(); }).join();
    EXPECT_FALSE(runsTheCommand(*adapter));
    std::thread([&guard] { guard = std::make_unique<LibGit2Guard>(); }).join();
    EXPECT_TRUE(runsTheCommand(*adapter));
    guard.reset();
    EXPECT_FALSE(runsTheCommand(*adapter));
}

TEST_F(GuardRegistration, ServesAMergeOnAnotherThread)
{
    const auto adapter = newAdapter();
    bool runs = false;
    std::thread([&] { runs = runsTheCommand(*adapter); }).join();
    EXPECT_TRUE(runs);
}

TEST_F(GuardRegistration, EndsWithARecordAndBeginsWithout)
{
    vclink::test::LogCapture log;
    {
        const LibGit2Guard guard;
        EXPECT_THAT(log.messages(), testing::IsEmpty());
    }
    EXPECT_THAT(log.messages(), testing::ElementsAre("Unregister merge driver: *"));
}

TEST_F(GuardRegistration, NeverOutlivesItsRecord)
{
    for (int i = 0; i < 20; ++i)
    {
        std::optional<LibGit2Guard> first(std::in_place);
        std::optional<LibGit2Guard> second(std::in_place);
        first.reset();
        std::optional<LibGit2Guard> third(std::in_place);
        EXPECT_TRUE(isRegistered());
        second.reset();
        EXPECT_FALSE(isRegistered());
        third.reset();
    }
}

} // namespace
