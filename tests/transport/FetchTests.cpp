// SPDX-License-Identifier: MIT
#include <string>
#include <string_view>

#include <git2/errors.h>
#include <gtest/gtest.h>

#include "TransportFixture.hpp"
#include "support/libgit2Release.hpp"

namespace
{

using namespace vclink::test;

/// Two clones of one repository: what the library fetches into the one is what git fetches into the
/// other.
class Fetch : public TransportFixture
{
  protected:
    Fetch()
    {
        change("file", "first\n");
        source_.git({"branch", "deleted"});
        publish({"--all"});
        fetched_ = cloneWithGit("fetched");
        fetchedByGit_ = cloneWithGit("fetched by git");
    }

    /// Fetches into both.
    void fetchBoth()
    {
        fetch(fetched_);
        fetchedByGit_.git({"fetch", "--quiet"});
    }
    void expectSame() const
    {
        EXPECT_EQ(referencesOf(fetched_), referencesOf(fetchedByGit_));
        expectSound(fetched_);
    }
    /// The id of a reference that was fetched, empty where there is none.
    std::string fetchedId(const std::string &reference) const
    {
        return fetched_.line({"for-each-ref", "--format=%(objectname)", reference});
    }

    GitRepository fetched_{folder().path()};
    GitRepository fetchedByGit_{folder().path()};
};

TEST_P(Fetch, TakesANewBranch)
{
    source_.git({"switch", "--quiet", "--create", "new"});
    const std::string id = change("file", "new\n");
    publish({"new"});
    fetchBoth();
    EXPECT_EQ(fetchedId("refs/remotes/origin/new"), id);
    expectSame();
}

TEST_P(Fetch, MovesTheBranchThatMoved)
{
    const std::string id = change("file", "second\n");
    publish({"main"});
    fetchBoth();
    EXPECT_EQ(fetchedId("refs/remotes/origin/main"), id);
    EXPECT_EQ(fetched_.read("file"), "first\n") << "the working tree is the user's";
    expectSame();
}

TEST_P(Fetch, MovesTheBranchThatWasRewritten)
{
    change("file", "second\n");
    publish({"main"});
    fetchBoth();
    source_.git({"reset", "--quiet", "--hard", "HEAD~"});
    const std::string id = change("file", "another second\n");
    publish({"+main"});
    fetchBoth();
    EXPECT_EQ(fetchedId("refs/remotes/origin/main"), id);
    expectSame();
}

TEST_P(Fetch, KeepsTheBranchThatTheRemoteDeletedAsGitDoes)
{
    const std::string id = fetchedId("refs/remotes/origin/deleted");
    publish({":deleted"});
    fetchBoth();
    EXPECT_NE(id, "");
    EXPECT_EQ(fetchedId("refs/remotes/origin/deleted"), id);
    expectSame();
}

TEST_P(Fetch, RemovesTheBranchThatTheRemoteDeletedWherePruneIsConfigured)
{
    publish({":deleted"});
    for (const auto &clone : {fetched_, fetchedByGit_})
        clone.git({"config", "remote.origin.prune", "true"});
    fetchBoth();
    EXPECT_EQ(fetchedId("refs/remotes/origin/deleted"), "");
    expectSame();
}

TEST_P(Fetch, TakesTheTagsOfWhatItTakes)
{
    change("file", "second\n");
    source_.git({"tag", "light"});
    source_.git(
        {"-c", "user.name=a", "-c", "user.email=a@example.com", "tag", "-m", "tag", "annotated"});
    publish({"main", "light", "annotated"});
    fetchBoth();
    EXPECT_NE(fetchedId("refs/tags/light"), "");
    EXPECT_NE(fetchedId("refs/tags/annotated"), "");
    expectSame();
}

TEST_P(Fetch, OfNothingNewChangesNothing)
{
    const std::string before = referencesOf(fetched_);
    fetchBoth();
    EXPECT_EQ(referencesOf(fetched_), before);
    expectSame();
}

TEST_P(Fetch, TakesWhatTheRefspecsNameOnly)
{
    const std::string id = change("file", "second\n");
    publish({"main", "main:other"});
    fetch(fetched_, {"refs/heads/main:refs/remotes/elsewhere/one"});
    EXPECT_EQ(fetchedId("refs/remotes/elsewhere/one"), id);
    EXPECT_EQ(fetchedId("refs/remotes/origin/other"), "");
    expectSound(fetched_);
}

/// libgit2 does not compare the commits: they are downloaded and compared before.
TEST_P(Fetch, MovesABranchBesideOnlyForward)
{
    fetched_.git({"branch", "copy"});
    fetched_.write("own", "x");
    const std::string own = fetched_.commitAll("own");
    const std::string id = change("file", "second\n");
    publish({"main"});
    const auto fetchInto = [this](const std::string &branch)
    {
        fetched_.git({"config", "remote.origin.fetch", "refs/heads/main:refs/heads/" + branch});
        fetch(fetched_, {"refs/heads/main"});
    };
    EXPECT_EQ(failureOf([&] { fetchInto("main"); }).code, GIT_ENONFASTFORWARD);
    EXPECT_EQ(fetchedId("refs/heads/main"), own);
    fetchInto("copy");
    EXPECT_EQ(fetchedId("refs/heads/copy"), id);
    expectSound(fetched_);
}

TEST_P(Fetch, MovesNotesBesideOnlyForward)
{
    constexpr const char *notes = "refs/notes/commits";
    const auto append = [](const GitRepository &repository, const std::string &words)
    {
        repository.git(
            {"-c", "user.name=A", "-c", "user.email=a@b", "notes", "append", "-m", words, "HEAD"});
    };
    append(source_, "first");
    publish({notes});
    fetched_.git({"config", "--add", "remote.origin.fetch", "refs/notes/*:refs/notes/*"});
    fetch(fetched_, {notes});
    const std::string first = fetchedId(notes);
    append(source_, "second");
    publish({notes});
    fetch(fetched_, {notes});
    const std::string second = fetchedId(notes);
    EXPECT_EQ(second, source_.line({"rev-parse", notes}));
    fetched_.git({"update-ref", notes, first});
    append(fetched_, "own");
    const std::string own = fetchedId(notes);
    EXPECT_EQ(failureOf([&] { fetch(fetched_, {notes}); }).code, GIT_ENONFASTFORWARD);
    // A server need not allow ids.
    EXPECT_NE(failureOf([&] { fetch(fetched_, {second + ':' + notes}); }).code, GIT_OK);
    EXPECT_EQ(fetchedId(notes), own);
    expectSound(fetched_);
}

TEST_P(Fetch, KeepsAShallowRepositorySound)
{
    constexpr std::string_view into = "refs/heads/main:refs/heads/";
    const bool isByPath = GetParam() == Transport::Path || GetParam() == Transport::File;
    const int failure = libgit2_release::failureOfShallowFetch(isByPath);
    const std::string old = change("file", "second\n");
    publish({"main", ":deleted"});
    GitRepository shallow = makeRepository("shallow");
    shallow.git({"remote", "add", "origin", url_});
    shallow.git({"fetch", "--quiet", "--depth=1", "origin", "main"});
    shallow.git({"checkout", "--quiet", "-b", "own", "FETCH_HEAD"});
    shallow.write("own", "x");
    shallow.commitAll("own");
    shallow.git({"checkout", "--quiet", "--detach"});
    const std::string id = change("file", "third\n");
    publish({"main"});
    const std::string before = referencesOf(shallow);
    const std::string beginning = shallow.read(".git/shallow");

    EXPECT_EQ(failureOf([&] { fetch(shallow, {std::string(into) + "own"}); }).code,
              failure != GIT_OK ? failure : int{GIT_ENONFASTFORWARD});
    EXPECT_EQ(referencesOf(shallow), before);
    if (failure == GIT_OK)
        fetch(shallow);
    else
        EXPECT_EQ(failureOf([&] { fetch(shallow); }).code, failure);
    EXPECT_EQ(shallow.line({"rev-parse", "origin/main"}), failure != GIT_OK ? old : id);
    EXPECT_EQ(shallow.read(".git/shallow"), beginning);
    expectSound(shallow);
}

TEST_P(Fetch, TakesAThousandCommits)
{
    const std::string tip = change("file", "the first of many\n");
    std::string commits;
    for (int i = 1; i <= 1000; ++i)
    {
        commits += "commit refs/heads/many\ncommitter a <a@example.com> " +
                   std::to_string(1'600'000'000 + i) + " +0000\ndata 2\nm\n" +
                   (i == 1 ? "from " + tip + "\n" : "") + "M 644 inline file\ndata <<END\n" +
                   std::to_string(i) + "\nEND\n\n";
    }
    source_.command({"fast-import", "--quiet"}).input(commits + "done\n").runOrThrow();
    publish({"many"});
    fetchBoth();
    EXPECT_EQ(fetched_.line({"rev-list", "--count", "refs/remotes/origin/many"}), "1002");
    expectSame();
}

INSTANTIATE_TEST_SUITE_P(Over, Fetch, allTransports(), testing::PrintToStringParamName());

} // namespace
