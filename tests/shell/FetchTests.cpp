// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellRemoteFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::HasSubstr;
using testing::StartsWith;

class ShellFetch : public ShellRemoteFixture
{
  protected:
    ShellFetch()
    {
        colleague_.write("a", "theirs\n");
        colleague_.commitAll("their work");
        colleague_.git({"tag", "v1"});
        colleague_.git({"push", "--quiet", "origin", "main", "main:new", "v1"});
    }

    GitRepository colleague_ = GitRepository::clone(url_, folder() / "colleague");
};

TEST_F(ShellFetch, BringsBranchesAndTheirTagsUpToDateAsGitDoes)
{
    const GitRepository twin(folder() / "twin");
    std::filesystem::copy(repository_.path(), twin.path(),
                          std::filesystem::copy_options::recursive);
    const std::string before = repository_.line({"rev-parse", "main"});
    succeed({"fetch", "origin"});
    twin.git({"fetch", "--quiet", "origin"});
    EXPECT_EQ(references(repository_), references(twin));
    EXPECT_EQ(references(repository_).at("refs/tags/v1"), references(served_).at("refs/tags/v1"));
    EXPECT_EQ(repository_.line({"rev-parse", "main"}), before);
    EXPECT_EQ(repository_.git({"status", "--porcelain"}), "");
    EXPECT_EQ(repository_.git({"fsck", "--no-progress"}), "");
}

TEST_F(ShellFetch, BringsOnlyWhatIsNamed)
{
    const std::string before = references(repository_).at("refs/remotes/origin/main");
    succeed({"fetch", "origin", "+refs/heads/new:refs/mine/new"});
    EXPECT_EQ(references(repository_).at("refs/mine/new"),
              references(served_).at("refs/heads/new"));
    EXPECT_EQ(references(repository_).at("refs/remotes/origin/main"), before);
    succeed({"fetch", "origin", "refs/heads/main:refs/mine/1", "refs/heads/new:refs/mine/2"});
    EXPECT_EQ(references(repository_).count("refs/mine/1"), 1U);
    EXPECT_EQ(references(repository_).count("refs/mine/2"), 1U);
}

TEST_F(ShellFetch, KeepsABranchThatIsGoneAtTheRemote)
{
    succeed({"fetch", "origin"});
    const References before = references(repository_);
    colleague_.git({"push", "--quiet", "origin", ":new"});
    succeed({"fetch", "origin"});
    EXPECT_EQ(references(repository_), before);
}

TEST_F(ShellFetch, FindsARemoteWithARelativePathFromTheRoot)
{
    repository_.git({"remote", "add", "near", "../colleague"});
    repository_.makeFolder("deep/folder");
    EXPECT_EQ(runIn(repository_ / "deep/folder", {"fetch", "near"}).errors, "");
    EXPECT_EQ(references(repository_).at("refs/remotes/near/main"),
              references(colleague_).at("refs/heads/main"));
}

TEST_F(ShellFetch, TellsAPersonHowMuchHasChanged)
{
    EXPECT_EQ(show({"fetch", "origin"}), "Fetched from origin: 3 references changed.\n");
    EXPECT_EQ(show({"fetch", "origin", "refs/heads/new:refs/mine/new"}),
              "Fetched from origin: 1 reference changed.\n");
    EXPECT_EQ(show({"fetch", "origin"}), "There was nothing new at origin.\n");
    EXPECT_EQ(refuse({"fetch", "origin", "refs/heads/missing:refs/mine/missing"}),
              "Nothing was fetched: origin has no reference 'refs/heads/missing'.\n");
    EXPECT_EQ(refuse({"fetch", "origin", "main", "mian"}),
              "Nothing was fetched: origin has no reference 'mian'. Did you mean 'main'?\n");
}

TEST_F(ShellFetch, RefusesARemoteThatIsNotConfigured)
{
    EXPECT_THAT(refuse({"fetch", "nobody"}), StartsWith("There is no remote 'nobody'."));
    EXPECT_EQ(refuse({"fetch", "orgin"}), "There is no remote 'orgin'. Did you mean 'origin'?\n");
    repository_.git({"remote", "remove", "origin"});
    EXPECT_EQ(refuse({"fetch"}),
              "There is no remote 'origin'. Add one with \"git remote add origin "
              "ADDRESS\".\n");
    EXPECT_THAT(refuse({"fetch", url_}), HasSubstr("is not a valid remote name"));
}

TEST_F(ShellFetch, TellsWhyARemoteCannotBeReached)
{
    repository_.git({"remote", "set-url", "origin", daemon().base() + "/missing.git"});
    EXPECT_THAT(refuse({"fetch", "origin"}), HasSubstr("no such repository"));
    repository_.git({"remote", "set-url", "origin", "../missing"});
    EXPECT_THAT(refuse({"fetch", "origin"}), HasSubstr("unsupported URL protocol"));
    EXPECT_THAT(refuse({"--lang", "de", "fetch", "origin"}),
                StartsWith("Git konnte den Vorgang nicht "));
}

TEST_F(ShellFetch, RefusesWhatIsNoRefspec)
{
    EXPECT_THAT(refuse({"fetch", "origin", "a:b:c"}), HasSubstr("is not a valid refspec"));
}

TEST_F(ShellFetch, NeedsAWorkingCopy)
{
    const CommandResult result = shell({"fetch", "origin"}).run();
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_THAT(result.errors, HasSubstr("is a Git working copy"));
}

} // namespace
} // namespace vclink::test
