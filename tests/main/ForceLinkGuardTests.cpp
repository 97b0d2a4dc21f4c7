// SPDX-License-Identifier: MIT
#include "main/ForceLinkGuard.hpp"

#include <filesystem>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "StagingTest.hpp"
#include "error/errorUtil/GitResult.hpp"
#include "support/text.hpp"
#include "util/repository.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

namespace fs = std::filesystem;
namespace git = vclink::git;
using testing::Contains;
using vclink::test::asPath;
using vclink::test::GitRepository;

/// What a record's own notification was told.
struct Heard
{
    std::vector<std::string> names;
    std::string failsAt;
};

int hear(git_checkout_notify_t /*why*/, const char *path, const git_diff_file * /*baseline*/,
         const git_diff_file * /*target*/, const git_diff_file * /*workdir*/, void *payload)
{
    auto &heard = *static_cast<Heard *>(payload);
    heard.names.emplace_back(path);
    return heard.failsAt == path ? GIT_EAUTH : 0;
}

/// A folder and a file of the repository have become links to what lies outside.
class ForceLinkGuard : public vclink::test::StagingTest
{
  protected:
    ForceLinkGuard()
    {
        repository_.write("folder/a", "committed");
        repository_.write("zlast", "committed");
        repository_.commitAll("second");
        repository_.write("../outside/a", "precious");
        repository_.write("../outside/other", "precious");
        repository_.remove("folder");
        repository_.remove("other");
        repository_.symlink("../outside", "folder");
        repository_.symlink("../outside/other", "other");
        repository_.write("zlast", "edited");
    }

    /// A checkout by force of everything.
    /// @return libgit2's code
    int checkOut()
    {
        const auto repository = git::openRepository(asPath(repository_.path()));
        git_checkout_options record;
        git_checkout_options_init(&record, GIT_CHECKOUT_OPTIONS_VERSION);
        record.checkout_strategy = GIT_CHECKOUT_FORCE;
        record.notify_flags = GIT_CHECKOUT_NOTIFY_ALL;
        record.notify_cb = hear;
        record.notify_payload = &heard_;
        git::ForceLinkGuard links(repository.get(), record);
        return git_checkout_index(repository.get(), nullptr, &record);
    }
    void expectNothingOutsideChanged() const
    {
        EXPECT_EQ(repository_.read("../outside/a"), "precious");
        EXPECT_EQ(repository_.read("../outside/other"), "precious");
    }

    Heard heard_;
};

TEST_F(ForceLinkGuard, MakesFilesAndFoldersAgainOfLinks)
{
    EXPECT_EQ(checkOut(), 0);
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), "");
    EXPECT_TRUE(fs::is_directory(fs::symlink_status(repository_ / "folder")));
    EXPECT_TRUE(fs::is_regular_file(fs::symlink_status(repository_ / "other")));
    expectNothingOutsideChanged();
}

TEST_F(ForceLinkGuard, HandsTheNotificationsOn)
{
    EXPECT_EQ(checkOut(), 0);
    EXPECT_THAT(heard_.names, Contains("folder/a"));
    EXPECT_THAT(heard_.names, Contains("other"));
    EXPECT_THAT(heard_.names, Contains("zlast"));
}

TEST_F(ForceLinkGuard, PutsTheLinksBackWhenTheCheckoutIsGivenUp)
{
    const std::string before = repository_.git({"status", "--porcelain"});
    heard_.failsAt = "zlast";
    EXPECT_EQ(checkOut(), GIT_EAUTH);
    EXPECT_THAT(heard_.names, Contains("folder/a"));
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), before);
    EXPECT_EQ(fs::read_symlink(repository_ / "folder"), "../outside");
    EXPECT_EQ(fs::read_symlink(repository_ / "other"), "../outside/other");
    expectNothingOutsideChanged();
}

TEST_F(ForceLinkGuard, LeavesTheLinkOfAFileThatTheCallbackRefuses)
{
    heard_.failsAt = "folder/a";
    EXPECT_EQ(checkOut(), GIT_EAUTH);
    EXPECT_EQ(fs::read_symlink(repository_ / "folder"), "../outside");
}

TEST_F(ForceLinkGuard, LeavesTrackedAndUntrackedLinksThatAreNotInTheWay)
{
    ASSERT_EQ(checkOut(), 0);
    repository_.symlink("zlast", "tracked");
    repository_.commitAll("third");
    repository_.remove("tracked");
    repository_.symlink("file", "tracked");
    repository_.symlink("zlast", "untracked");
    repository_.write("zlast", "edited");
    EXPECT_EQ(checkOut(), 0);
    EXPECT_EQ(fs::read_symlink(repository_ / "tracked"), "zlast");
    EXPECT_EQ(fs::read_symlink(repository_ / "untracked"), "zlast");
    EXPECT_EQ(repository_.read("zlast"), "committed");
}

TEST_F(ForceLinkGuard, HoldsInAMerge)
{
    repository_.git({"config", "user.name", "Somebody"});
    repository_.git({"config", "user.email", "somebody@example.com"});
    repository_.git({"checkout", "--quiet", "--force", "-b", "side"});
    ASSERT_EQ(checkOut(), 0);
    repository_.write("file", "theirs");
    repository_.commitAll("theirs");
    repository_.git({"checkout", "--quiet", "main"});
    repository_.write("sub/inside", "ours");
    repository_.commitAll("ours");
    repository_.remove("folder");
    repository_.symlink("../outside", "folder");
    const auto adapter = makeAdapter(repository_.path());
    git::BranchManager::create(*adapter)->merge("side");
    EXPECT_EQ(repository_.read("file"), "theirs");
    EXPECT_EQ(repository_.read("folder/a"), "committed");
    EXPECT_TRUE(fs::is_directory(fs::symlink_status(repository_ / "folder")));
    expectNothingOutsideChanged();
}

/// The states are not known then, and are not needed.
TEST_F(ForceLinkGuard, HoldsInARevertWhoseStateWalkFails)
{
    GitRepository::init(repository_ / "line\nfeed").commit("first");
    repository_.write(".gitmodules", "[submodule \"s\"]\n\tpath = \"line\\nfeed\"\n");
    repository_.add({".gitmodules", "line\nfeed"});
    repository_.commit("third");
    EXPECT_THROW(revert({"*"}), git::LibGit2Exception);
    expectNothingOutsideChanged();
}

} // namespace
