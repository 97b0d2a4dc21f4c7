// SPDX-License-Identifier: MIT
#include <filesystem>
#include <functional>
#include <string>

#include <boost/filesystem/exception.hpp>
#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "StagingFixture.hpp"

namespace
{

namespace fs = std::filesystem;
using testing::ElementsAre;
using vclink::test::asPath;
using vclink::test::failureOf;
using vclink::test::indexOf;
using vclink::test::NothingChanges;
using vclink::test::RepositoryState;
using vclink::test::States;

class MarkResolved : public vclink::test::StagingFixture
{
};

TEST_F(MarkResolved, PutsTheFileAsItStandsIntoThePlaceOfAConflict)
{
    beginMerge({"conflicted", "left"});
    repository_.write("conflicted", "merged\n");
    const RepositoryState expected = stateAfterGit({{"add", "conflicted"}});
    markResolved("conflicted");
    EXPECT_EQ(stateOf(repository_), expected);
    EXPECT_EQ(states(repository_, {"conflicted", "left"}),
              (States{{"conflicted", "Modified"}, {"left", "InConflict"}}));
}

TEST_F(MarkResolved, TakesTheMarkersOfAConflictAlong)
{
    beginMerge({"conflicted"});
    markResolved("conflicted");
    EXPECT_NE(repository_.git({"show", ":conflicted"}).find("<<<<<<<"), std::string::npos);
}

TEST_F(MarkResolved, TakesOurSideForNoChange)
{
    beginMerge({"conflicted"});
    repository_.write("conflicted", "ours\n");
    markResolved("conflicted");
    EXPECT_THAT(status(), ElementsAre());
}

TEST_F(MarkResolved, LeavesTheMergeUnderWay)
{
    beginMerge({"conflicted"});
    const RepositoryState before = stateOf(repository_);
    markResolved("conflicted");
    const RepositoryState after = stateOf(repository_);
    EXPECT_EQ(after.underWay, before.underWay);
    EXPECT_EQ(after.underWay.count("MERGE_HEAD"), 1U);
    EXPECT_EQ(after.head, before.head);
    EXPECT_EQ(after.workingTree, before.workingTree);
}

TEST_F(MarkResolved, PutsTheAbsenceOfAFileIntoThePlaceOfAConflict)
{
    beginMerge({"conflicted", "left"});
    repository_.remove("conflicted");
    const RepositoryState expected = stateAfterGit({{"rm", "--cached", "conflicted"}});
    markResolved("conflicted");
    EXPECT_EQ(stateOf(repository_), expected);
    EXPECT_EQ(states(repository_, {"conflicted"}), (States{{"conflicted", "Deleted"}}));
}

/// A merge in which one side deleted what the other edited.
class MarkResolvedOfADeletion : public MarkResolved
{
  protected:
    void mergeAfter(const std::function<void()> &ours, const std::function<void()> &theirs)
    {
        repository_.git({"branch", "theirs"});
        ours();
        repository_.commitAll("ours");
        repository_.git({"checkout", "--quiet", "theirs"});
        theirs();
        repository_.commitAll("theirs");
        repository_.git({"checkout", "--quiet", "main"});
        repository_.tryGit(
            {"-c", "user.name=T", "-c", "user.email=t@example.com", "merge", "--quiet", "theirs"});
        ASSERT_EQ(states(repository_, {"file"}), (States{{"file", "InConflict"}}));
    }
    void edit() const
    {
        repository_.write("file", "edited\n");
    }
    void take() const
    {
        repository_.remove("file");
    }
};

TEST_F(MarkResolvedOfADeletion, KeepsTheFileThatTheyDeletedWhileItStands)
{
    mergeAfter([this] { edit(); }, [this] { take(); });
    ASSERT_TRUE(fs::exists(repository_ / "file"));
    markResolved("file");
    EXPECT_THAT(status(), ElementsAre());
    EXPECT_EQ(repository_.git({"show", ":file"}), "edited\n");
}

TEST_F(MarkResolvedOfADeletion, AcceptsTheirDeletionWhenTheFileIsGone)
{
    mergeAfter([this] { edit(); }, [this] { take(); });
    repository_.remove("file");
    markResolved("file");
    EXPECT_THAT(status(), ElementsAre("D  file"));
}

TEST_F(MarkResolvedOfADeletion, BringsBackTheFileThatWeDeletedWhileItStands)
{
    mergeAfter([this] { take(); }, [this] { edit(); });
    ASSERT_TRUE(fs::exists(repository_ / "file"));
    markResolved("file");
    EXPECT_THAT(status(), ElementsAre("A  file"));
}

TEST_F(MarkResolvedOfADeletion, KeepsOurDeletionWhenTheFileIsGone)
{
    mergeAfter([this] { take(); }, [this] { edit(); });
    repository_.remove("file");
    markResolved("file");
    EXPECT_THAT(status(), ElementsAre());
    EXPECT_EQ(indexOf(repository_).count("file"), 0U);
}

TEST_F(MarkResolved, EndsTheConflictOfEachPathOfARenaming)
{
    repository_.write("old", std::string(1000, 'x') + "\n");
    repository_.commitAll("second");
    repository_.git({"branch", "theirs"});
    repository_.git({"mv", "old", "ours"});
    repository_.commit("ours");
    repository_.git({"checkout", "--quiet", "theirs"});
    repository_.git({"mv", "old", "theirs"});
    repository_.commit("theirs");
    repository_.git({"checkout", "--quiet", "main"});
    repository_.tryGit(
        {"-c", "user.name=T", "-c", "user.email=t@example.com", "merge", "--quiet", "theirs"});
    ASSERT_THAT(status(), ElementsAre("DD old", "AU ours", "UA theirs"));
    for (const auto *name : {"old", "ours", "theirs"})
        markResolved(name);
    EXPECT_THAT(status(), ElementsAre("A  theirs"));
    EXPECT_EQ(indexOf(repository_).count("old"), 0U);
}

TEST_F(MarkResolved, SucceedsWithoutAnEffectForAPathThatIsNowhere)
{
    const RepositoryState before = stateOf(repository_);
    EXPECT_NO_THROW(markResolved("missing"));
    EXPECT_NO_THROW(markResolved("missing/below"));
    EXPECT_EQ(stateOf(repository_), before);
}

TEST_F(MarkResolved, AddsNothingOfAnUntrackedFileThatGitIgnores)
{
    repository_.write(".git/info/exclude", "*.o\n");
    repository_.write("a.o", "x");
    const RepositoryState before = stateOf(repository_);
    EXPECT_NO_THROW(markResolved("a.o"));
    EXPECT_EQ(stateOf(repository_), before);
}

TEST_F(MarkResolved, TakesATrackedFileThatIsIgnoredToo)
{
    beginMerge({"conflicted"});
    repository_.write(".git/info/exclude", "conflicted\nfile\n");
    repository_.write("conflicted", "merged\n");
    repository_.write("file", "edited\n");
    const RepositoryState expected = stateAfterGit({{"add", "--update", "file", "conflicted"}});
    markResolved("file");
    markResolved("conflicted");
    EXPECT_EQ(stateOf(repository_), expected);
}

TEST_F(MarkResolved, StagesAnEditAndANewFile)
{
    repository_.write("file", "edited\n");
    repository_.write("new", "x");
    const RepositoryState expected = stateAfterGit({{"add", "file", "new"}});
    markResolved("file");
    markResolved("new");
    EXPECT_EQ(stateOf(repository_), expected);
}

TEST_F(MarkResolved, StagesTheDeletionOfAMissingFile)
{
    repository_.remove("file");
    markResolved("file");
    EXPECT_THAT(status(), ElementsAre("D  file"));
}

TEST_F(MarkResolved, TakesAnEmptyPathAndTheRootForNothing)
{
    repository_.write("file", "edited\n");
    repository_.write("new", "x");
    const RepositoryState before = stateOf(repository_);
    const auto adapter = makeAdapter(repository_.path());
    adapter->markResolved(upath());
    adapter->markResolved(asPath(repository_.path()));
    adapter->markResolved(asPath(repository_ / "."));
    adapter->markResolved(asPath("missing/relative"));
    adapter->markResolved(asPath("/"));
    EXPECT_EQ(stateOf(repository_), before);
}

TEST_F(MarkResolved, TakesAFolderForAllBelowIt)
{
    beginMerge({"dir/a", "dir/b", "c"});
    repository_.write("dir/new", "x");
    markResolved("dir");
    EXPECT_THAT(status(), ElementsAre("UU c", "M  dir/a", "M  dir/b", "A  dir/new"));
}

TEST_F(MarkResolved, TakesALinkForItsTarget)
{
    repository_.symlink("file", "link");
    repository_.commitAll("second");
    repository_.write("file", "edited\n");
    repository_.remove("link");
    repository_.symlink("other", "link");
    markResolved("link");
    EXPECT_THAT(status(), ElementsAre(" M file", " M link"));
    repository_.write("other", "edited\n");
    markResolved("link");
    EXPECT_THAT(status(), ElementsAre(" M file", " M link", "M  other"));
}

/// Whether something stands there is asked of the link's target.
TEST_F(MarkResolved, TakesALinkThatLeadsNowhereForAnAbsence)
{
    repository_.symlink("nowhere", "link");
    repository_.commitAll("second");
    markResolved("link");
    EXPECT_THAT(status(), ElementsAre("D  link", "?? link"));
}

TEST_F(MarkResolved, RaisesOnALoopOfLinks)
{
    repository_.symlink("loop", "loop");
    const NothingChanges nothing(repository_);
    EXPECT_THROW(markResolved("loop"), boost::filesystem::filesystem_error);
}

TEST_F(MarkResolved, TakesTheFileWhereAFolderStandsNow)
{
    repository_.remove("file");
    repository_.write("file/inside", "x");
    const RepositoryState expected = stateAfterGit({{"add", "file"}});
    markResolved("file");
    EXPECT_EQ(stateOf(repository_), expected);
}

TEST_F(MarkResolved, TakesTheFilesOfAFolderWhereAFileStandsNow)
{
    repository_.remove("sub");
    repository_.write("sub", "x");
    const RepositoryState expected = stateAfterGit({{"add", "sub"}});
    markResolved("sub");
    EXPECT_EQ(stateOf(repository_), expected);
}

TEST_F(MarkResolved, TakesTheNewCommitOfASubmodule)
{
    auto inner = makeRepository("inner");
    inner.write("file", "x");
    inner.commitAll("first");
    inner.commit("second");
    repository_.git({"submodule", "--quiet", "add", inner.path().string(), "module"});
    repository_.commit("second");
    vclink::test::GitRepository(repository_ / "module").git({"checkout", "--quiet", "HEAD~1"});
    const RepositoryState expected = stateAfterGit({{"add", "module"}});
    markResolved("module");
    EXPECT_EQ(indexOf(repository_), expected.index);
    EXPECT_THAT(status(), ElementsAre("M  module"));
}

TEST_F(MarkResolved, RaisesForAFileThatStandsInABareRepository)
{
    const std::string bare = folder() / "bare";
    repository_.git({"clone", "--quiet", "--bare", repository_.path().string(), bare});
    const auto adapter = makeAdapter(bare);
    EXPECT_EQ(failureOf([&] { adapter->markResolved(asPath(bare + "/config")); }).code,
              GIT_EBAREREPO);
    EXPECT_FALSE(fs::exists(bare + "/index"));
}

} // namespace
