// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "StagingFixture.hpp"
#include "support/Sentence.hpp"

namespace
{

namespace fs = std::filesystem;
using testing::ElementsAre;
using namespace vclink::test;

using MarkResolved = StagingFixture;

TEST_F(MarkResolved, PutsWhatStandsOrItsAbsenceIntoThePlaceOfAConflict)
{
    beginMerge({"gone", "left", "markers", "merged", "ours"});
    repository_.write("merged", "merged\n");
    repository_.write("ours", "ours\n");
    repository_.remove("gone");
    const std::vector<std::string> names{"gone", "markers", "merged", "ours"};
    RepositoryState expected = stateAfterGit(
        {{"rm", "--quiet", "--cached", "gone"}, {"add", "markers", "merged", "ours"}});
    EXPECT_EQ(expected.underWay.count("MERGE_HEAD"), 1U);
    for (const auto &name : names)
        markResolved(name);
    EXPECT_EQ(stateOf(repository_), expected);
    EXPECT_EQ(states(repository_, names), (States{{"gone", "Deleted"},
                                                  {"markers", "Modified"},
                                                  {"merged", "Modified"},
                                                  {"ours", "Clean"}}));
    EXPECT_EQ(states(repository_, {"left"}), (States{{"left", "InConflict"}}));
    EXPECT_NE(repository_.git({"show", ":markers"}).find("<<<<<<<"), std::string::npos);
}

/// A merge in which one side deleted "file" and the other edited it: whether ours did, whether the
/// file exists when it is marked, and what git's status is then.
struct DeletionRow : Sentence
{
    bool isOurs;
    bool stands;
    std::vector<std::string> status;
};

class MarkResolvedOfADeletion : public MarkResolved, public testing::WithParamInterface<DeletionRow>
{
};

TEST_P(MarkResolvedOfADeletion, Takes)
{
    const auto commitSide = [this](bool isDeleted)
    {
        if (isDeleted)
            repository_.remove("file");
        else
            repository_.write("file", "edited\n");
        repository_.commitAll("side");
    };
    repository_.git({"branch", "theirs"});
    commitSide(GetParam().isOurs);
    repository_.git({"checkout", "--quiet", "theirs"});
    commitSide(!GetParam().isOurs);
    repository_.git({"checkout", "--quiet", "main"});
    repository_.tryGit(
        {"-c", "user.name=T", "-c", "user.email=t@example.com", "merge", "--quiet", "theirs"});
    ASSERT_EQ(states(repository_, {"file"}), (States{{"file", "InConflict"}}));
    ASSERT_TRUE(fs::exists(repository_ / "file"));
    if (!GetParam().stands)
        repository_.remove("file");
    markResolved("file");
    EXPECT_EQ(status(), GetParam().status);
    EXPECT_EQ(indexOf(repository_).count("file"), GetParam().stands ? 1U : 0U);
}

const DeletionRow deletionRows[]{
    {{"OurFileThatTheyDeletedWhileItStands"}, false, true, {}},
    {{"TheirDeletionWhenTheFileIsGone"}, false, false, {"D  file"}},
    {{"TheirFileThatWeDeletedWhileItStands"}, true, true, {"A  file"}},
    {{"OurDeletionWhenTheFileIsGone"}, true, false, {}},
};

INSTANTIATE_TEST_SUITE_P(Merges, MarkResolvedOfADeletion, testing::ValuesIn(deletionRows),
                         testing::PrintToStringParamName());

TEST_F(MarkResolved, EndsTheConflictOfEachPathOfARenaming)
{
    repository_.commitAll(writes("old", std::string(1000, 'x') + "\n"), "second");
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

TEST_F(MarkResolved, SucceedsWithoutAnEffectForAPathThatIsNowhereOrIgnored)
{
    repository_.write(".git/info/exclude", "*.o\n");
    repository_.write("a.o", "x");
    const RepositoryState before = stateOf(repository_);
    for (const auto *name : {"missing", "missing/below", "a.o"})
        EXPECT_NO_THROW(markResolved(name));
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

TEST_F(MarkResolved, StagesAnEditANewFileAndADeletion)
{
    repository_.write("file", "edited\n");
    repository_.write("new", "x");
    repository_.remove("other");
    const RepositoryState expected = stateAfterGit({{"add", "--all"}});
    for (const auto *name : {"file", "new", "other"})
        markResolved(name);
    EXPECT_EQ(stateOf(repository_), expected);
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
    repository_.commitAll(links("file", "link"), "second");
    repository_.write("file", "edited\n");
    repository_.remove("link");
    repository_.symlink("other", "link");
    markResolved("link");
    EXPECT_THAT(status(), ElementsAre(" M file", " M link"));
    repository_.write("other", "edited\n");
    markResolved("link");
    EXPECT_THAT(status(), ElementsAre(" M file", " M link", "M  other"));
}

/// The link's target decides whether the file exists.
TEST_F(MarkResolved, TakesALinkThatLeadsNowhereForAnAbsence)
{
    repository_.commitAll(links("nowhere", "link"), "second");
    markResolved("link");
    EXPECT_THAT(status(), ElementsAre("D  link", "?? link"));
}

TEST_F(MarkResolved, TakesFilesAndFoldersThatStandInEachOthersPlaces)
{
    repository_.remove("file");
    repository_.write("file/inside", "x");
    repository_.remove("sub");
    repository_.write("sub", "x");
    const RepositoryState expected = stateAfterGit({{"add", "file", "sub"}});
    markResolved("file");
    markResolved("sub");
    EXPECT_EQ(stateOf(repository_), expected);
}

TEST_F(MarkResolved, LeavesFilesThatASparseCheckoutLeavesOut)
{
    beginMerge({"in/conflict"});
    repository_.git({"update-index", "--skip-worktree", "file", "sub/inside"});
    repository_.remove("file");
    repository_.remove("sub");
    repository_.remove("in");
    const RepositoryState expected = stateOf(repository_);
    markResolved("file");
    markResolved("sub");
    EXPECT_EQ(stateOf(repository_), expected);
    markResolved("in");
    EXPECT_THAT(status(), ElementsAre("D  in/conflict"));
}

TEST_F(MarkResolved, TakesTheNewCommitOfASubmodule)
{
    addModule();
    GitRepository(repository_ / "module").git({"checkout", "--quiet", "HEAD~1"});
    const RepositoryState expected = stateAfterGit({{"add", "module"}});
    markResolved("module");
    EXPECT_EQ(indexOf(repository_), expected.index);
    EXPECT_THAT(status(), ElementsAre("M  module"));
}

} // namespace
