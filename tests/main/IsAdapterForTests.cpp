// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>

#include <git2.h>
#include <gtest/gtest.h>

#include "support/Failure.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/UnprivilegedUser.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAdapterFactory.hpp"

namespace
{

using vclink::git::GitAdapterFactory;
using namespace vclink::test;

/// "true", "false", or the code of the exception.
std::string probe(const std::string &path)
{
    bool isAdapter = false;
    const auto failure =
        failureIfAny([&] { isAdapter = GitAdapterFactory().isAdapterFor(asPath(path)); });
    return failure ? std::to_string(failure->code) : isAdapter ? "true" : "false";
}

/// The same, asked of libgit2 itself.
std::string probeDirectly(const std::string &path)
{
    const int code =
        git_repository_open_ext(nullptr, path.c_str(), GIT_REPOSITORY_OPEN_NO_SEARCH, nullptr);
    return code == 0 ? "true" : code == GIT_ENOTFOUND ? "false" : std::to_string(code);
}

class IsAdapterFor : public GitFixture
{
  protected:
    void expectProbe(const std::filesystem::path &path, const std::string &expected) const
    {
        EXPECT_EQ(probe(path), expected) << path;
        EXPECT_EQ(probeDirectly(path), expected) << path;
    }

    LibGit2Session session_{environment()};
    GitRepository repository_ = makeRepository();
};

/// Also one that is bare, linked, a submodule, reached through a link, or damaged where only an
/// operation meets it.
TEST_F(IsAdapterFor, IsTrueForTheRootOfAWorkingCopy)
{
    for (const auto *name : {"", ".", ".git"})
        expectProbe(repository_ / name, "true");
    expectProbe(repository_.path(), "true");
    repository_.git({"init", "--quiet", "--bare", (folder() / "bare").string()});
    expectProbe(folder() / "bare", "true");
    repository_.commit("first");
    repository_.git({"worktree", "add", "--quiet", (folder() / "linked").string()});
    ASSERT_TRUE(std::filesystem::is_regular_file(folder() / "linked/.git"));
    expectProbe(folder() / "linked", "true");
    auto inner = makeRepository("inner");
    inner.commit("first");
    repository_.git({"submodule", "--quiet", "add", inner.path().string(), "module"});
    expectProbe(repository_ / "module", "true");
    repository_.symlink(repository_.path().string(), "../link");
    expectProbe(folder() / "link", "true");
    inner.write(".git/config", "[core\n");
    expectProbe(inner.path(), "true");
    repository_.write(".git/HEAD", "no reference\n");
    expectProbe(repository_.path(), "true");
}

TEST_F(IsAdapterFor, IsFalseForWhatIsNoRoot)
{
    repository_.write("file", "x");
    repository_.makeFolder("sub/dir");
    repository_.makeFolder("empty/.git");
    for (const auto *name : {"missing", "file", "file/x", "sub", "sub/dir", "empty"})
        expectProbe(repository_ / name, "false");
    expectProbe("", "false");
    expectProbe(environment().home(), "false");
}

TEST_F(IsAdapterFor, IsFalseForARepositoryWithoutItsParts)
{
    for (const auto *part : {"HEAD", "objects", "refs"})
    {
        const auto broken = makeRepository(std::string("without-") + part);
        broken.remove(std::string(".git/") + part);
        expectProbe(broken.path(), "false");
    }
}

TEST_F(IsAdapterFor, RaisesForAGitFileThatCannotBeReadAndANameThatTheSystemRefuses)
{
    repository_.write("garbage/.git", "neither a folder nor a link");
    expectProbe(repository_ / "garbage", std::to_string(GIT_ERROR));
    repository_.write("empty/.git", "");
    expectProbe(repository_ / "empty", std::to_string(GIT_ERROR));
    repository_.write("nowhere/.git", "gitdir: nowhere\n");
    expectProbe(repository_ / "nowhere", "false");
    expectProbe(repository_ / std::string(300, 'n'), std::to_string(GIT_ERROR));
}

TEST_F(IsAdapterFor, RaisesWhereTheFolderCannotBeReached)
{
    giveToUnprivilegedUser(repository_.path());
    const std::string inside = repository_ / "locked/inside";
    std::filesystem::create_directories(inside);
    repository_.setMode("locked", 0000);
    EXPECT_EQ(
        runAsUnprivilegedUser([&] { return probe(repository_.path()) + " " + probe(inside); }),
        "true " + std::to_string(GIT_ERROR));
}

/// libgit2 cannot distinguish such a folder from one without a repository.
TEST_F(IsAdapterFor, AnswersAsLibGit2DoesForAFolderThatCannotBeLookedInto)
{
    giveToUnprivilegedUser(repository_.path());
    std::filesystem::permissions(repository_.path(), std::filesystem::perms(0000));
    EXPECT_EQ(runAsUnprivilegedUser(
                  [&] { return probe(repository_.path()) + probeDirectly(repository_.path()); }),
              "falsefalse");
}

} // namespace
