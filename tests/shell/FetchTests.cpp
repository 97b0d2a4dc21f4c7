// SPDX-License-Identifier: MIT
#include <utility>

#include <gmock/gmock.h>

#include "ShellRemoteFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::EndsWith;
using testing::HasSubstr;
using testing::Not;
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

/// So do pushes and listings.
TEST_F(ShellFetch, SaysThatTheRemoteHasAFormatThatLibGit2DoesNotKnow)
{
    const GitRepository other = makeRepository("other");
    other.write(".git/config", "[core]\nrepositoryformatversion = 9\n");
    repository_.git({"remote", "add", "other", other.path().string()});
    const std::string advice = "core.repositoryformatversion and extensions in\n";
    for (const std::vector<std::string> &arguments :
         {std::vector<std::string>{"fetch", "other"},
          {"heads", "other"},
          {"push", "other", "refs/heads/main:refs/heads/main"}})
    {
        const CommandResult result = run(arguments);
        EXPECT_EQ(result.exitStatus, 1) << arguments.front();
        EXPECT_THAT(result.errors, HasSubstr("\nvclink-shell: libgit2 does not know the format of "
                                             "the remote repository; " +
                                             advice + "its configuration describe it. "))
            << arguments.front();
    }
    // Only git knows this extension.
    repository_.git({"config", "core.repositoryFormatVersion", "1"});
    repository_.git({"config", "extensions.noop-v1", "true"});
    EXPECT_THAT(run({"fetch", "origin"}).errors,
                HasSubstr("the format of this repository; " + advice + ".git/config describe it."));
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

/// libgit2 creates references before it prunes.
TEST_F(ShellFetch, NamesTheCommandForABranchThatTheRemoteReplacedByOneInItsFolder)
{
    repository_.git({"config", "fetch.prune", "true"});
    for (const bool isPacked : {false, true})
    {
        for (const auto &[older, newer] :
             {std::pair("new", "new/one"), std::pair("new/one", "new")})
        {
            SCOPED_TRACE(older + std::string(isPacked ? ", packed" : ""));
            repository_.git({"fetch", "--quiet", "--prune", "origin"});
            ASSERT_EQ(references(repository_).count("refs/remotes/origin/" + std::string(older)),
                      1U);
            if (isPacked)
                repository_.git({"pack-refs", "--all"});
            colleague_.git({"push", "--quiet", "origin", ":" + std::string(older)});
            colleague_.git({"push", "--quiet", "origin", "main:refs/heads/" + std::string(newer)});
            EXPECT_THAT(refuse({"fetch", "origin"}),
                        EndsWith("\nvclink-shell: Branches such as \"a\" and \"a/b\" can't exist "
                                 "side by side. If the remote has deleted the older one,\n\"git "
                                 "fetch --prune REMOTE\" deletes it here too, and fetches the new "
                                 "one.\n"));
        }
    }
    repository_.git({"fetch", "--quiet", "--prune", "origin"});
    succeed({"fetch", "origin"});
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
    EXPECT_EQ(refuse({"fetch", url_}),
              "There is no remote '" + url_ +
                  "'. To use an address, give it a name: \"git remote add NAME " + url_ + "\".\n");
}

TEST_F(ShellFetch, TellsWhyARemoteCannotBeReached)
{
    repository_.git({"remote", "set-url", "origin", server().base() + "/missing.git"});
    EXPECT_THAT(refuse({"fetch", "origin"}), HasSubstr("no such repository"));
    repository_.git({"remote", "set-url", "origin", "../missing"});
    for (const std::string command : {"fetch", "push", "heads"})
        EXPECT_EQ(refuse({command, "origin"}),
                  "There is no repository under the path of the remote 'origin', ../missing: No "
                  "such file or directory.\n");
    repository_.git({"remote", "set-url", "origin", "strange://host/path"});
    const std::string errors = refuse({"--lang", "de", "fetch", "origin"});
    EXPECT_THAT(errors, StartsWith("Git konnte den Vorgang nicht "));
    EXPECT_THAT(errors, Not(HasSubstr("core.repositoryformatversion")));
}

TEST_F(ShellFetch, TakesTheOnlyRemoteWhateverItsName)
{
    repository_.git({"remote", "rename", "origin", "upstream"});
    succeed({"fetch"});
    EXPECT_EQ(references(repository_).at("refs/remotes/upstream/main"),
              references(served_).at("refs/heads/main"));
    repository_.git({"remote", "add", "other", url_});
    EXPECT_EQ(refuse({"fetch"}), "There is no remote 'origin'. Remotes: other, upstream.\n");
}

/// As git. The next commit would undo what the branch got.
TEST_F(ShellFetch, MovesNoBranchThatIsCheckedOut)
{
    const std::string linked = (folder() / "linked").string();
    repository_.git({"worktree", "add", "--quiet", "-b", "side", linked});
    const struct
    {
        std::vector<std::string> refspecs;
        std::string branch;
        std::string place;
    } cases[] = {
        {{"main:main"}, "main", repository_.path()},
        {{"refs/tags/v1:refs/x", "+refs/heads/*:refs/heads/*"}, "main", repository_.path()},
        {{"refs/heads/new:side"}, "side", linked}};
    for (const auto &[refspecs, branch, place] : cases)
    {
        std::vector<std::string> arguments{"fetch", "origin"};
        arguments.insert(arguments.end(), refspecs.begin(), refspecs.end());
        EXPECT_EQ(refuse(arguments),
                  "Nothing was fetched: that would move the branch '" + branch +
                      "', which is checked out in the working copy " + place +
                      ".\nFetch into refs/remotes/origin/ instead, and merge.\n");
        arguments.insert(arguments.begin() + 1, "--quiet");
        EXPECT_NE(repository_.tryGit(arguments).exitStatus, 0) << refspecs.front();
    }
    repository_.git({"config", "remote.origin.fetch", "+refs/heads/*:refs/heads/*"});
    EXPECT_THAT(refuse({"fetch"}), StartsWith("Nothing was fetched: that would move the branch"));
    std::filesystem::rename(linked, folder() / "away");
    EXPECT_THAT(refuse({"fetch", "origin", "refs/heads/new:side"}),
                StartsWith("The branch 'side' is checked out in the working copy"));
    succeed({"fetch", "origin", "refs/heads/main:fresh"});
    EXPECT_EQ(references(repository_).at("refs/heads/fresh"),
              references(served_).at("refs/heads/main"));
}

/// As git.
TEST_F(ShellFetch, MovesNoBranchThatIsCheckedOutUnderAnotherName)
{
    repository_.git({"symbolic-ref", "refs/heads/alias", "refs/heads/main"});
    repository_.git({"symbolic-ref", "HEAD", "refs/heads/alias"});
    EXPECT_NE(repository_.tryGit({"fetch", "origin", "main:main"}).exitStatus, 0);
    for (const std::string name : {"main", "alias"})
    {
        EXPECT_THAT(refuse({"fetch", "origin", "refs/heads/main:" + name}),
                    StartsWith("Nothing was fetched: that would move the branch '" + name +
                               "', which is checked out in the working copy"));
    }
}

/// As git, from each working copy.
TEST_F(ShellFetch, MovesNoBranchThatIsCheckedOutWhereverItsRepositoryIs)
{
    const std::filesystem::path root = repository_.path();
    const std::filesystem::path store = folder() / "store";
    const std::filesystem::path linked = folder() / "linked";
    const std::string begin = "vclink-shell: Nothing was fetched: that would move the branch 'main'"
                              ", which is checked out in the ";
    const std::string end = ".\nFetch into refs/remotes/origin/ instead, and merge.\n";
    const auto expectRefused = [&](const std::filesystem::path &own)
    {
        SCOPED_TRACE(own);
        const References before = references(repository_);
        EXPECT_NE(GitRepository(own).tryGit({"fetch", "origin", "main:main"}).exitStatus, 0);
        EXPECT_EQ(runIn(own, {"fetch", "origin", "main:main"}).errors,
                  begin + "working copy " + own.string() + end);
        GitRepository(own).git({"worktree", "add", "--quiet", "--detach", linked.string()});
        EXPECT_NE(GitRepository(linked).tryGit({"fetch", "origin", "main:main"}).exitStatus, 0);
        EXPECT_EQ(runIn(linked, {"fetch", "origin", "main:main"}).errors,
                  begin + "main working copy" + end);
        GitRepository(own).git({"worktree", "remove", linked.string()});
        EXPECT_EQ(references(repository_), before);
    };
    std::filesystem::rename(root / ".git", store);
    std::filesystem::create_directory_symlink("../" + store.filename().string(), root / ".git");
    expectRefused(root);
    std::filesystem::remove(root / ".git");
    repository_.write(".git", "gitdir: " + store.string() + '\n');
    expectRefused(root);
    const GitRepository parent(folder() / "parent");
    std::filesystem::create_directory(parent.path());
    parent.git({"init", "--quiet"});
    parent.git({"submodule", "--quiet", "add", url_, "sub"});
    GitRepository(parent / "sub").git({"reset", "--quiet", "--hard", "main~"});
    expectRefused(parent / "sub");
}

/// As git.
TEST_F(ShellFetch, MovesNoBranchThatARebaseMoves)
{
    const std::string linked = (folder() / "linked").string();
    repository_.git({"switch", "--quiet", "-c", "lower"});
    repository_.write("a", "ours\n");
    repository_.commitAll("ours");
    repository_.git({"branch", "middle"});
    repository_.write("folder/b", "ours\n");
    repository_.commitAll("ours, too");
    repository_.git({"worktree", "add", "--quiet", "-b", "side", linked, "main"});
    repository_.git({"fetch", "--quiet", "origin"});
    ASSERT_NE(repository_.tryGit({"rebase", "--update-refs", "origin/main"}).exitStatus, 0);
    for (const auto &root : {repository_.path(), std::filesystem::path(linked)})
    {
        EXPECT_NE(
            GitRepository(root).tryGit({"fetch", "--quiet", "origin", "+main:middle"}).exitStatus,
            0);
        EXPECT_EQ(runIn(root, {"fetch", "origin", "+main:middle"}).errors,
                  "vclink-shell: Nothing was fetched: that would move the branch 'middle', which a "
                  "rebase in the working copy " +
                      repository_.path().string() +
                      " moves when it ends.\nFetch into refs/remotes/origin/ instead, or end the "
                      "rebase first.\n");
    }
    EXPECT_EQ(runIn(linked, {"branch", "-d", "middle"}).errors,
              "vclink-shell: Nothing was deleted: a rebase in the working copy " +
                  repository_.path().string() +
                  " moves 'middle' when it ends.\nEnd the rebase first.\n");
    EXPECT_NE(GitRepository(linked).tryGit({"branch", "-D", "middle"}).exitStatus, 0);
    // git switches, too.
    EXPECT_EQ(runIn(linked, {"switch", "middle"}).errors, "");
    GitRepository(linked).git({"switch", "--quiet", "side"});
    GitRepository(linked).git({"switch", "--quiet", "middle"});
}

/// git makes such a HEAD for core.preferSymlinkRefs.
TEST_F(ShellFetch, MovesNoBranchOfAHeadThatIsALink)
{
    repository_.git(
        {"-c", "core.preferSymlinkRefs=true", "symbolic-ref", "HEAD", "refs/heads/main"});
    const std::vector<std::string> fetch{"fetch", "origin", "+refs/heads/new:refs/heads/main"};
    EXPECT_NE(repository_.tryGit(fetch).exitStatus, 0);
    EXPECT_THAT(refuse(fetch), HasSubstr("would move the branch 'main', which is checked out in"));
}

/// As git.
TEST_F(ShellFetch, DeletesNoBranchThatIsCheckedOut)
{
    repository_.git({"checkout", "--quiet", "-b", "topic"});
    repository_.git({"config", "fetch.prune", "true"});
    repository_.git({"config", "remote.origin.fetch", "refs/heads/topic:refs/heads/topic"});
    EXPECT_THAT(refuse({"fetch"}), HasSubstr("pruning would delete 'refs/heads/topic'"));
    EXPECT_NE(repository_.tryGit({"fetch", "--quiet", "origin"}).exitStatus, 0);
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
