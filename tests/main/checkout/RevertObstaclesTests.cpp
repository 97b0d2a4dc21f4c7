// SPDX-License-Identifier: MIT
#include "main/checkout/CheckoutWatch.hpp"

#include <filesystem>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"
#include "error/errorUtil/GitResult.hpp"
#include "main/files/StagingFixture.hpp"
#include "support/text.hpp"
#include "util/repository/repository.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

namespace fs = std::filesystem;
namespace git = vclink::git;
using testing::Contains;
using namespace vclink::test;

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
class RevertObstacles : public StagingFixture
{
  protected:
    RevertObstacles()
    {
        repository_.commitAll(writes("folder/a", "committed") + writes("zlast", "committed"),
                              "second");
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
        git::CheckoutWatch watch(git::CheckoutKind::Revert, repository.get(), record);
        return git_checkout_index(repository.get(), nullptr, &record);
    }
    void expectRefused(const std::vector<std::string> &names, const Failure &failure) const
    {
        const auto before = workingTreeOf(repository_);
        EXPECT_EQ(failureOf([&] { revert(names); }), failure);
        EXPECT_EQ(workingTreeOf(repository_), before);
    }
    void expectNothingOutsideChanged() const
    {
        EXPECT_EQ(repository_.read("../outside/a"), "precious");
        EXPECT_EQ(repository_.read("../outside/other"), "precious");
    }

    Heard heard_;
};

TEST_F(RevertObstacles, MakesFilesAndFoldersAgainOfLinks)
{
    EXPECT_EQ(checkOut(), 0);
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), "");
    EXPECT_TRUE(fs::is_directory(fs::symlink_status(repository_ / "folder")));
    EXPECT_TRUE(fs::is_regular_file(fs::symlink_status(repository_ / "other")));
    expectNothingOutsideChanged();
}

TEST_F(RevertObstacles, HandsTheNotificationsOn)
{
    EXPECT_EQ(checkOut(), 0);
    EXPECT_THAT(heard_.names, Contains("folder/a"));
    EXPECT_THAT(heard_.names, Contains("other"));
    EXPECT_THAT(heard_.names, Contains("zlast"));
}

TEST_F(RevertObstacles, PutsTheLinksBackWhenTheCheckoutIsGivenUp)
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

TEST_F(RevertObstacles, LeavesTheLinkOfAFileThatTheCallbackRefuses)
{
    heard_.failsAt = "folder/a";
    EXPECT_EQ(checkOut(), GIT_EAUTH);
    EXPECT_EQ(fs::read_symlink(repository_ / "folder"), "../outside");
}

TEST_F(RevertObstacles, LeavesTrackedAndUntrackedLinksThatAreNotInTheWay)
{
    ASSERT_EQ(checkOut(), 0);
    repository_.commitAll(links("zlast", "tracked"), "third");
    repository_.remove("tracked");
    repository_.symlink("file", "tracked");
    repository_.symlink("zlast", "untracked");
    repository_.write("zlast", "edited");
    EXPECT_EQ(checkOut(), 0);
    EXPECT_EQ(fs::read_symlink(repository_ / "tracked"), "zlast");
    EXPECT_EQ(fs::read_symlink(repository_ / "untracked"), "zlast");
    EXPECT_EQ(repository_.read("zlast"), "committed");
}

TEST_F(RevertObstacles, FifosSocketsAndDevicesAreReplacedAsGitDoes)
{
    repository_.git({"reset", "--quiet", "--hard"});
    repository_.remove("file");
    makeFifo(repository_ / "file");
    repository_.remove("other");
    makeSocket(repository_ / "other");
    repository_.remove("sub");
    makeFifo(repository_ / "sub");
    repository_.remove("zlast");
    makesDevice("zlast")(repository_);
    makeFifo(repository_ / "folder/pipe");
    expectRevertsAsGit({"file", "other", "sub/inside", "folder", "zlast"});
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), "");
    EXPECT_TRUE(fs::is_fifo(repository_ / "folder/pipe"));
}

TEST_F(RevertObstacles, PutsFifosBackWhenTheCheckoutIsGivenUp)
{
    repository_.remove("file");
    makeFifo(repository_ / "file");
    heard_.failsAt = "zlast";
    EXPECT_EQ(checkOut(), GIT_EAUTH);
    EXPECT_TRUE(fs::is_fifo(repository_ / "file"));
    EXPECT_EQ(fs::status(repository_ / "file").permissions(), fs::perms(0644));
}

TEST_F(RevertObstacles, FoldersInThePlaceOfAFileAreReplacedAsGitDoes)
{
    repository_.git({"reset", "--quiet", "--hard"});
    repository_.remove("file");
    repository_.write("file/mine", "mine\n");
    repository_.remove("other");
    GitRepository::init(repository_ / "other").commit("first");
    repository_.remove("zlast");
    repository_.makeFolder("zlast/empty");
    expectRevertsAsGit({"file", "other", "zlast"});
}

/// libgit2 reads the folder after it has reported the file.
TEST_F(RevertObstacles, EmptyFoldersInThePlaceOfAFileAreReplacedWhateverItsName)
{
    for (const std::string name : {"!d/file", "#d/file", "d/file"})
    {
        repository_.commitAll(writes(name, name) + writes("zlast", name), name);
        repository_.remove(name);
        repository_.makeFolder(name);
        repository_.write("zlast", "mine");
        revert({name, "zlast"});
        EXPECT_EQ(repository_.read(name), name);
        EXPECT_EQ(repository_.read("zlast"), name);
    }
}

TEST_F(RevertObstacles, FilesInThePlaceOfAFolderAreReplacedAsGitDoes)
{
    repository_.git({"reset", "--quiet", "--hard"});
    repository_.commitAll(writes("sub/other", "x"), "third");
    repository_.remove("sub");
    repository_.write("sub", "mine\n");
    expectRevertsAsGit({"sub"});
}

/// libgit2's walk is past what is in the way, and would fail in the midst of its writing.
TEST_F(RevertObstacles, ThatLibGit2IsPastAreRefused)
{
    repository_.git({"reset", "--quiet", "--hard"});
    repository_.commitAll(writes("file-b", "x") + writes("sub-b", "x"), "neighbours");
    repository_.remove("sub");
    repository_.write("sub", "mine\n");
    repository_.write("sub-b", "edited\n");
    repository_.write("file-b", "edited\n");
    expectRefused({"sub/inside", "sub-b", "file-b"}, inTheWay("untracked file 'sub'"));
    repository_.remove("sub");
    repository_.remove("file");
    repository_.makeFolder("file");
    expectRevertsAsGit({"sub/inside", "sub-b", "file", "file-b"});
}

TEST_F(RevertObstacles, FoldersWithFilesThatLibGit2IsPastAreRefused)
{
    repository_.git({"reset", "--quiet", "--hard"});
    repository_.commitAll(writes("file-b", "x"), "neighbour");
    repository_.remove("file");
    repository_.write("file/mine", "mine\n");
    repository_.write("file-b", "edited\n");
    expectRefused({"file", "file-b"}, inTheWay("folder 'file'"));
}

TEST_F(RevertObstacles, AreFilesInThePlaceOfASubmodule)
{
    GitRepository::init(repository_ / "module").commit("first");
    repository_.commitAll("submodule");
    repository_.remove("module");
    repository_.write("module", "mine\n");
    repository_.write("file", "edited\n");
    expectRefused({"file", "module"}, inTheWay("untracked file 'module'"));
}

/// The states are not known then. The index has no file in conflict.
TEST_F(RevertObstacles, HoldsInARevertWhoseStateWalkFails)
{
    GitRepository::init(repository_ / "line\nfeed").commit("first");
    repository_.write(".gitmodules", "[submodule \"s\"]\n\tpath = \"line\\nfeed\"\n");
    repository_.add({".gitmodules", "line\nfeed"});
    repository_.commit("third");
    EXPECT_THROW(revert({"*"}), git::LibGit2Exception);
    expectNothingOutsideChanged();
}

} // namespace
