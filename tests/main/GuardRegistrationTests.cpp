// SPDX-License-Identifier: MIT
// The life of the merge driver's registration, seen through merges.
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <thread>
#include <utility>
#include <vector>

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
using vclink::git::GitAdapter;
using vclink::git::GitAdapterFactory;
using vclink::git::LibGit2Guard;
using namespace vclink::test;

bool isRegistered()
{
    return git_merge_driver_lookup("*") != nullptr;
}

class GuardRegistration : public AdapterFixture
{
  protected:
    GuardRegistration()
    {
        repository_.git({"config", "user.name", "Test Author"});
        repository_.git({"config", "user.email", "author@example.com"});
        repository_.git({"config", "merge.tool.driver", "cp %B %A"});
        repository_.commitAll(
            writes(".gitattributes", "file merge=tool\n") + writes("file", "base\n"), "base");
        repository_.git({"checkout", "--quiet", "-b", "theirs"});
        repository_.commitAll(writes("file", "theirs\n"), "theirs");
        repository_.git({"checkout", "--quiet", "main"});
        repository_.commitAll(writes("file", "ours\n"), "ours");
    }

    /// Whether a merge by an existing adapter runs the command; without it the file stays in
    /// conflict. The repository is then as before.
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

/// Each begins and ends a guard: by itself, on other threads, in another object.
TEST_F(GuardRegistration, IsLostWithAnInnerGuardAndRegainedWithTheNext)
{
    const upath root = asPath(repository_.path());
    const std::vector<std::pair<std::string, std::function<std::shared_ptr<void>()>>> guards{
        {"guard", [] { return std::make_shared<LibGit2Guard>(); }},
        {"adapter", [this] { return std::shared_ptr<GitAdapter>(newAdapter()); }},
        {"configuration", [] { return std::make_shared<vclink::git::GitConfig>(); }},
        {"generator", [this]
         {
             return std::shared_ptr<vclink::WorkingCopyGenerator>(
                 GitAdapterFactory().createWorkingCopyGenerator(interactor_));
         }}};
    const auto adapter = newAdapter();
    for (const auto &[name, begin] : guards)
    {
        SCOPED_TRACE(name);
        auto guard = begin();
        EXPECT_TRUE(isRegistered());
        EXPECT_TRUE(runsTheCommand(*adapter));
        std::thread([&] { guard.reset(); }).join();
        EXPECT_FALSE(isRegistered());
        EXPECT_FALSE(runsTheCommand(*adapter));
        std::thread([&, &start = begin] { guard = start(); }).join();
        EXPECT_TRUE(runsTheCommand(*adapter));
        EXPECT_TRUE(GitAdapterFactory().isAdapterFor(root));
        EXPECT_FALSE(runsTheCommand(*adapter)) << "a probe has a guard, too";
    }
}

TEST_F(GuardRegistration, IsLostWithAProbeThatSaysNoOrFails)
{
    repository_.write("broken/.git", "neither a folder nor a link");
    auto adapter = newAdapter();
    EXPECT_FALSE(GitAdapterFactory().isAdapterFor(asPath(folder() / "missing")));
    EXPECT_FALSE(runsTheCommand(*adapter));
    adapter = newAdapter();
    // The new adapter existed before the old one was destroyed.
    EXPECT_FALSE(isRegistered());
    adapter.reset();
    adapter = newAdapter();
    EXPECT_TRUE(isRegistered());
    EXPECT_THROW(GitAdapterFactory().isAdapterFor(asPath(repository_ / "broken")),
                 vclink::git::LibGit2Exception);
    EXPECT_FALSE(isRegistered());
}

TEST_F(GuardRegistration, StandsForTheLifeOfTheOnlyGuardAndServesMergesOnAnyThread)
{
    EXPECT_FALSE(isRegistered());
    for (int i = 0; i < 2; ++i)
    {
        const auto adapter = newAdapter();
        EXPECT_TRUE(runsTheCommand(*adapter));
        bool runs = false;
        std::thread([&] { runs = runsTheCommand(*adapter); }).join();
        EXPECT_TRUE(runs);
    }
    EXPECT_FALSE(isRegistered());
}

TEST_F(GuardRegistration, EndsWithARecordAndBeginsWithout)
{
    LogCapture log;
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
