// SPDX-License-Identifier: MIT
// What a fetch refuses as git does, where libgit2 does not.
#include <string>
#include <vector>

#include <git2/errors.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "RemoteFixture.hpp"
#include "support/WithoutLeakChecks.hpp"
#include "support/libgit2Release.hpp"
#include "support/text.hpp"

namespace
{

using testing::HasSubstr;
using namespace vclink::test;
using Refspecs = std::vector<std::string>;
constexpr int shallowFailure = libgit2_release::failureOfShallowFetch(true);

/// The branch "copy" is where the server's "main" was, and "own" has a commit of its own on top.
/// Nothing is checked out.
class FetchObstacles : public RemoteFixture
{
  protected:
    void start(const std::vector<std::string> &depth = {})
    {
        std::vector<std::string> arguments{"fetch", "--quiet"};
        arguments.insert(arguments.end(), depth.begin(), depth.end());
        arguments.insert(arguments.end(), {"origin", "main"});
        repository_.git(arguments);
        repository_.git({"checkout", "--quiet", "-b", "own", "FETCH_HEAD"});
        repository_.git({"branch", "copy"});
        commit("own", "x");
        repository_.git({"checkout", "--quiet", "--detach"});
        publish("file", "changed\n");
    }

    static CommandResult fetchWithGit(const GitRepository &copy, const Refspecs &refspecs)
    {
        std::vector<std::string> arguments{"fetch", "--quiet", "origin"};
        arguments.insert(arguments.end(), refspecs.begin(), refspecs.end());
        return copy.tryGit(arguments);
    }

    void expectRefusedAsByGit(const Refspecs &refspecs, int code, const std::string &name) const
    {
        EXPECT_FALSE(fetchWithGit(twin(), refspecs).succeeded());
        expectRefused(refspecs, code, GIT_ERROR_REFERENCE, '\'' + name + '\'');
    }

    void expectRefused(const Refspecs &refspecs, int code, int errorClass,
                       const std::string &words) const
    {
        SCOPED_TRACE(testing::PrintToString(refspecs));
        const auto before = references(repository_);
        const auto failure = failureOf([&] { fetch(refspecs); });
        EXPECT_EQ(failure.code, code);
        EXPECT_EQ(failure.errorClass, errorClass);
        EXPECT_THAT(failure.text, HasSubstr(words));
        EXPECT_EQ(references(repository_), before);
    }

    void expectAsGitDoes(const Refspecs &refspecs) const
    {
        SCOPED_TRACE(testing::PrintToString(refspecs));
        const auto copy = twin();
        EXPECT_TRUE(fetchWithGit(copy, refspecs).succeeded());
        fetch(refspecs);
        EXPECT_EQ(references(repository_), references(copy));
    }

    void configure(const Refspecs &refspecs) const
    {
        repository_.git({"config", "--unset-all", "remote.origin.fetch"});
        for (const auto &refspec : refspecs)
            repository_.git({"config", "--add", "remote.origin.fetch", refspec});
    }

    /// @param all the refspecs, the second of which excludes "own"
    void expectRefusedThoughGitKeeps(const Refspecs &given, const Refspecs &all) const
    {
        const auto copy = twin();
        EXPECT_TRUE(fetchWithGit(copy, given).succeeded());
        for (const auto *const branch : {"own", "copy"})
            EXPECT_EQ(idOf(branch, copy), idOf(branch));
        expectRefused(given, GIT_ERROR, GIT_ERROR_INVALID, '\'' + all.at(1) + '\'');
    }

    static void writeNote(const GitRepository &repository, const std::string &words)
    {
        repository.git(
            {"-c", "user.name=A", "-c", "user.email=a@b", "notes", "append", "-m", words, "HEAD"});
    }

    /// A tag of the author's at the server, and another one here; both annotated, or none.
    void tagBoth(const std::string &name, bool isAnnotated)
    {
        std::vector<std::string> tag{"-c", "user.name=A", "-c", "user.email=a@b", "tag", "--force"};
        if (isAnnotated)
            tag.insert(tag.end(), {"-m", "words"});
        tag.push_back(name);
        author_.git(tag);
        author_.git({"push", "--quiet", "--force", "server", name});
        tag.emplace_back("copy");
        repository_.git(tag);
    }
};

TEST_F(FetchObstacles, KeepWhatPruningWouldDeleteForAMissingSource)
{
    start();
    const std::string all = "+refs/heads/*:refs/remotes/origin/*";
    for (const auto *const setting : {"fetch.prune", "remote.origin.prune"})
    {
        repository_.git({"config", setting, "true"});
        for (const Refspecs &refspecs :
             {Refspecs{"refs/heads/own:refs/heads/own"}, {"+own:own"}, {all, "gone:copy"}})
            expectRefusedAsByGit(refspecs, GIT_ENOTFOUND,
                                 "refs/heads/" + std::string(refspecs.size() > 1 ? "copy" : "own"));
        repository_.git({"config", "remote.origin.fetch", "refs/heads/own:refs/heads/own"});
        expectRefusedAsByGit({}, GIT_ENOTFOUND, "refs/heads/own");
        repository_.git({"config", "remote.origin.fetch", all});
        expectAsGitDoes({"refs/heads/main:refs/heads/copy"});
        expectAsGitDoes({"main:copy", all});
        expectAsGitDoes({});
        // Nothing of the user's is lost.
        repository_.git({"update-ref", "refs/remotes/origin/gone", "own"});
        fetch({"refs/heads/gone:refs/remotes/origin/gone"});
        EXPECT_FALSE(repository_.tryGit({"rev-parse", "--verify", "origin/gone"}).succeeded());
        fetch({"refs/heads/gone:refs/heads/new"});
        repository_.git({"config", "--unset", setting});
    }
    const auto before = references(repository_);
    fetch({"refs/heads/own:refs/heads/own"});
    EXPECT_EQ(references(repository_), before);
}

TEST_F(FetchObstacles, KeepTagsThatAreOthersAtTheRemote)
{
    start();
    repository_.git({"fetch", "--quiet", "origin"});
    for (const bool isAnnotated : {false, true})
    {
        tagBoth("v1", isAnnotated);
        const std::string name = "refs/tags/v1";
        repository_.git({"config", "remote.origin.tagOpt", "--tags"});
        expectRefusedAsByGit({}, GIT_EEXISTS, name);
        expectRefusedAsByGit({"refs/heads/main:refs/own/main"}, GIT_EEXISTS, name);
        repository_.git({"config", "remote.origin.tagOpt", "--no-tags"});
        for (const auto *const refspec :
             {"refs/tags/v1:refs/tags/v1", "refs/tags/*:refs/tags/*", "refs/*:refs/*"})
            expectRefusedAsByGit({refspec}, GIT_EEXISTS, name);
        expectRefusedAsByGit({"refs/heads/main:refs/tags/v1"}, GIT_EEXISTS, name);
        expectAsGitDoes({});
        // libgit2 keeps the tag itself.
        repository_.git({"config", "--unset", "remote.origin.tagOpt"});
        expectAsGitDoes({});
        const auto before = references(repository_);
        fetch({"refs/tags/v1:refs/tags/v1"});
        EXPECT_EQ(references(repository_), before);
    }
}

TEST_F(FetchObstacles, ReplaceTagsByForceAndTakeNewOnes)
{
    start();
    tagBoth("v1", true);
    repository_.git({"config", "remote.origin.tagOpt", "--no-tags"});
    expectAsGitDoes({"+refs/tags/*:refs/tags/*"});
    EXPECT_EQ(idOf("refs/tags/v1"), idOf("refs/tags/v1", server_));
    tagBoth("v2", false);
    repository_.git({"config", "remote.origin.tagOpt", "--tags"});
    repository_.git({"config", "--add", "remote.origin.fetch", "+refs/tags/*:refs/tags/*"});
    expectAsGitDoes({});
    EXPECT_EQ(idOf("refs/tags/v2"), idOf("refs/tags/v2", server_));
    repository_.git({"config", "--unset", "remote.origin.fetch", "tags"});
    author_.git({"tag", "v3"});
    author_.git({"push", "--quiet", "server", "v3"});
    expectAsGitDoes({});
}

TEST_F(FetchObstacles, KeepCommitsInAShallowRepository)
{
    publish("file", "once more\n");
    start({"--depth=1"});
    const std::string own = "refs/heads/main:refs/heads/own";
    if (shallowFailure != GIT_OK)
    {
        for (const auto &refspec : {own, '+' + own})
            expectRefused({refspec}, shallowFailure, GIT_ERROR_REPOSITORY, "'git fetch'");
        return;
    }
    expectRefusedAsByGit({own}, GIT_ENONFASTFORWARD, "refs/heads/own");
    expectRefusedAsByGit({"main:own"}, GIT_ENONFASTFORWARD, "refs/heads/own");
    {
        // libgit2 does not release what it has of two histories if a parent is missing.
        const WithoutLeakChecks without;
        expectAsGitDoes({"refs/heads/main:refs/heads/copy", "refs/heads/main:refs/heads/new"});
        expectAsGitDoes({"refs/heads/main:refs/heads/copy"});
    }
    EXPECT_EQ(idOf("copy"), idOf("main", author_));
    expectAsGitDoes({'+' + own});
    EXPECT_EQ(idOf("own"), idOf("main", author_));
}

/// With 1.9, a fetch that is killed can leave such a file behind.
TEST_F(FetchObstacles, TakeAnEmptyListOfTheOldestCommitsForNone)
{
    start();
    repository_.write(".git/shallow", "");
    const std::string own = idOf("own");
    fetch({"refs/heads/main:refs/heads/own", "refs/heads/main:refs/heads/copy"});
    EXPECT_EQ(idOf("own"), own);
    EXPECT_EQ(idOf("copy"), idOf("main", author_));
}

/// There, libgit2 does not see that the repository is shallow.
TEST_F(FetchObstacles, KeepCommitsInALinkedWorkingTreeOfAShallowRepository)
{
    publish("file", "once more\n");
    start({"--depth=1"});
    const std::string linked = folder() / "linked";
    repository_.git({"worktree", "add", "--quiet", "--detach", linked});
    const auto adapter = makeAdapter(linked);
    const auto before = references(repository_);
    const auto fetchThere = [&adapter]
    {
        vclink::git::GitRemote::create("origin", *adapter)
            ->fetch({asUtf16("refs/heads/main:refs/heads/own")});
    };
    EXPECT_EQ(failureOf(fetchThere).code,
              shallowFailure != GIT_OK ? shallowFailure : int{GIT_ENONFASTFORWARD});
    EXPECT_EQ(references(repository_), before);
}

/// libgit2 compares no commits for them.
TEST_F(FetchObstacles, KeepCommitsFromConfiguredRefspecsAndIds)
{
    start();
    const std::string id = idOf("main", author_);
    expectRefusedAsByGit({id + ":refs/heads/own"}, GIT_ENONFASTFORWARD, "refs/heads/own");
    repository_.git({"config", "remote.origin.fetch", "refs/heads/main:refs/heads/own"});
    expectRefusedAsByGit({"refs/heads/main"}, GIT_ENONFASTFORWARD, "refs/heads/own");
    repository_.git({"config", "remote.origin.fetch", "refs/heads/main:refs/heads/copy"});
    expectAsGitDoes({"refs/heads/main"});
    EXPECT_EQ(idOf("copy"), id);
    repository_.git({"branch", "--force", "copy", "copy~"});
    expectAsGitDoes({id + ":refs/heads/copy"});
    expectAsGitDoes({'+' + id + ":refs/heads/own"});
    EXPECT_EQ(idOf("own"), id);
}

TEST_F(FetchObstacles, KeepNotes)
{
    start();
    const std::string notes = "refs/notes/commits";
    const std::string spec = notes + ':' + notes;
    writeNote(author_, "first");
    author_.git({"push", "--quiet", "server", notes});
    repository_.git({"fetch", "--quiet", "origin", "main", spec});
    writeNote(repository_, "own");
    writeNote(author_, "second");
    author_.git({"push", "--quiet", "server", notes});
    const std::string id = idOf(notes, author_);
    for (const std::string &refspec :
         {spec, std::string("refs/notes/*:refs/notes/*"), std::string("refs/n*:refs/n*"),
          id + ':' + notes, "refs/heads/main:refs/heads/new " + id + ':' + notes})
        expectRefusedAsByGit(split(refspec, ' '), GIT_ENONFASTFORWARD, notes);
    repository_.git({"config", "--add", "remote.origin.fetch", "refs/notes/*:refs/notes/*"});
    expectRefusedAsByGit({}, GIT_ENONFASTFORWARD, notes);
    expectRefusedAsByGit({notes}, GIT_ENONFASTFORWARD, notes);
    expectAsGitDoes({"main"});
    expectAsGitDoes({id});
    repository_.git({"update-ref", notes, notes + '~'});
    expectAsGitDoes({notes});
    EXPECT_EQ(idOf(notes), id);
    writeNote(repository_, "own");
    expectAsGitDoes({'+' + id + ':' + notes});
    EXPECT_EQ(idOf(notes), id);
}

/// git compares the commits of tags, and lets other objects move.
TEST_F(FetchObstacles, KeepOtherReferencesAsGitDoes)
{
    start();
    tagBoth("v1", true);
    repository_.git({"config", "remote.origin.tagOpt", "--no-tags"});
    repository_.git({"update-ref", "refs/own/tag", "v1"});
    repository_.git({"update-ref", "refs/own/commit", "own"});
    repository_.git({"update-ref", "refs/own/tree", "own^{tree}"});
    // libgit2 does not release what it has of a history if the other object is no commit.
    const WithoutLeakChecks without;
    expectAsGitDoes({"refs/tags/v1:refs/own/tag"});
    EXPECT_EQ(idOf("refs/own/tag"), idOf("v1", author_));
    expectAsGitDoes({"refs/tags/v1:refs/own/tree"});
    EXPECT_EQ(idOf("refs/own/tree"), idOf("v1", author_));
    expectRefusedAsByGit({"refs/tags/v1:refs/own/commit"}, GIT_ENONFASTFORWARD, "refs/own/commit");
    author_.git({"push", "--quiet", "server", "HEAD^{tree}:refs/own/tree"});
    expectAsGitDoes({"refs/own/tree:refs/own/commit"});
    EXPECT_EQ(idOf("refs/own/commit"), idOf("HEAD^{tree}", author_));
}

/// They repeat what the remote has.
TEST_F(FetchObstacles, LeaveRemoteTrackingBranchesToLibGit2)
{
    start();
    const std::string tracking = "refs/remotes/origin/main";
    repository_.git({"update-ref", tracking, "own"});
    repository_.git({"config", "remote.origin.fetch", "refs/heads/*:refs/remotes/origin/*"});
    const std::string own = idOf("own");
    fetch();
    EXPECT_EQ(idOf(tracking), own);
    fetch({"refs/heads/main"});
    EXPECT_EQ(idOf(tracking), idOf("main", author_));
    repository_.git({"update-ref", tracking, "own"});
    fetch({idOf("main", author_) + ':' + tracking});
    EXPECT_EQ(idOf(tracking), idOf("main", author_));
}

/// The server has an older "own" and no "copy".
TEST_F(FetchObstacles, KeepWhatANegativeRefspecExcludes)
{
    start();
    author_.git({"push", "--quiet", "server", "HEAD~:refs/heads/own"});
    const Refspecs all{"+refs/heads/*:refs/heads/*", "^refs/heads/own", "^refs/heads/c*"};
    for (const auto *const prune : {"false", "true"})
    {
        repository_.git({"config", "fetch.prune", prune});
        configure({"+refs/heads/*:refs/remotes/origin/*"});
        expectRefusedThoughGitKeeps(all, all);
        configure(all);
        expectRefusedThoughGitKeeps({}, all);
    }
}

TEST_F(FetchObstacles, FollowGivenRefspecsBesideANegativeOne)
{
    start();
    configure({"+refs/heads/*:refs/remotes/origin/*", "^refs/heads/main"});
    if (libgit2_release::refusesNegativeRefspecs)
        expectRefused({"refs/heads/main"}, GIT_ERROR, GIT_ERROR_INVALID, "'^refs/heads/main'");
    else
        expectAsGitDoes({"refs/heads/main"});
}

/// libgit2 would give a branch the id of the tag.
TEST_F(FetchObstacles, KeepABranchFromATag)
{
    start();
    tagBoth("v1", true);
    repository_.git({"config", "remote.origin.tagOpt", "--no-tags"});
    expectRefusedAsByGit({"refs/tags/v1:refs/heads/own"}, GIT_ENONFASTFORWARD, "refs/heads/own");
}

} // namespace
