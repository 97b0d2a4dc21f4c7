// SPDX-License-Identifier: MIT
#include <ctime>
#include <string>
#include <utility>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "ObstacleFixture.hpp"

namespace
{

using testing::ElementsAre;
using testing::IsEmpty;
using namespace vclink::test;

Failure edited(const std::string &name)
{
    return refusal("the uncommitted changes of '" + name + "' would be lost in the merge");
}

Failure hiddenEdit(const std::string &name, const std::string &option)
{
    return refusal("the changes of '" + name +
                   "' would be lost in the merge. Git hides them, because the "
                   "file is marked " +
                   option + ": take the mark away with 'git update-index --no-" + option +
                   "' and commit, or remove the file");
}

/// A true merge beside edits of tracked files.
using MergeEdits = ObstacleFixture;

TEST_F(MergeEdits, OfFilesThatItDoesNotTouchAreRefused)
{
    theyWrite({"theirs"});
    expectEachRefused({{writes("other", "mine\n"), edited("other")},
                       {makesExecutable("d/g"), edited("d/g")},
                       {links("f", "d/g"), edited("d/g")},
                       {removes("d") + links("../outside", "d"), edited("d")},
                       {removes("d") + writes("d", "mine\n"), edited("d")}});
    expectCleanAsGit();
}

TEST_F(MergeEdits, AreRefusedWithTheFirstName)
{
    theyWrite({"d/new"});
    expectEachRefused({{writesEach({"other", "file", "d/g"}, "mine\n"), edited("d/g")}});
    repository_.write("d/new", "mine\n");
    repository_.git({"update-index", "--skip-worktree", "other"});
    repository_.write("other", "mine\n");
    expectMergeRefused(inTheWay("untracked file 'd/new'"));
}

/// libgit2 does not see these, and the commit would have those of files that the merge leaves
/// alone.
TEST_F(MergeEdits, OfTheSameSizeAndTimeAreRefused)
{
    theyWrite({"d/g"});
    // libgit2 never sees these if the file is dated before 1970.
    repository_.git({"config", "core.trustctime", "false"});
    for (const auto &[name, time] :
         std::vector<std::pair<std::string, std::time_t>>{{"d/f", 1'000'000'000}, {"d/g", -1000}})
    {
        SCOPED_TRACE(name);
        const std::string content = repository_.read(name);
        setsAnOldTime(name, time)(repository_);
        repository_.git({"update-index", "--refresh"});
        writesAtTheSameTime(name, "M\n")(repository_);
        expectMergeRefused(edited(name));
        EXPECT_EQ(repository_.read(name), "M\n");
        repository_.write(name, content);
    }
    expectCleanAsGit();
}

/// As after a copy of a working copy with its times.
TEST_F(MergeEdits, AreNotOtherInodesWithTheSameContent)
{
    theyWrite({"d/g"});
    for (const std::string name : {"d/f", "d/g", "other"})
    {
        setsAnOldTime(name)(repository_);
        repository_.git({"update-index", "--refresh"});
        const std::string content = repository_.read(name);
        repository_.remove(name);
        repository_.write(name, content);
        setsAnOldTime(name)(repository_);
    }
    expectCleanAsGit();
}

/// The commit would have what the file holds in place of what git stores.
TEST_F(MergeEdits, MayBeInOtherInodesOfFilteredFilesUntilGitHasLookedAtThem)
{
    repository_.git({"config", "filter.large.clean", "tr a-z A-Z"});
    repository_.git({"config", "filter.large.smudge", "tr A-Z a-z"});
    repository_.commitAll(writes(".gitattributes", "/d/f filter=large\n"), "attributes");
    repository_.commitAll(writes("d/f", "large\n"), "filtered");
    theyWrite({"theirs"});
    setsAnOldTime("d/f")(repository_);
    repository_.git({"update-index", "--refresh"});
    repository_.remove("d/f");
    repository_.write("d/f", "large\n");
    setsAnOldTime("d/f")(repository_);
    expectMergeRefused(edited("d/f"));
    EXPECT_THAT(status(), IsEmpty());
    expectCleanAsGit();
}

TEST_F(MergeEdits, MayBeInFilesThatCannotBeRead)
{
    theyWrite({"theirs"});
    repository_.write("other", "mine\n");
    EXPECT_EQ(
        runUnprivileged("other", 0200, [this] { return failureOfMerge("topic"); }),
        textOf(refusal("'other' cannot be read, and its changes would be lost in the checkout")));
    EXPECT_EQ(repository_.read("other"), "mine\n");
}

/// libgit2 would forget the conflict, and delete a file that HEAD does not have.
TEST_F(MergeEdits, InConflictAreRefusedWithoutAMergeUnderWay)
{
    theyWrite({"theirs"});
    repository_.write("other", "mine\n");
    repository_.git({"stash"});
    repository_.commitAll(removes("other"), "ours, too");
    EXPECT_FALSE(repository_.tryGit({"stash", "pop"}).succeeded());
    ASSERT_THAT(status(), ElementsAre("DU other"));
    expectMergeRefused(refusal("'other' is in conflict: resolve it before the merge"));
    EXPECT_EQ(repository_.read("other"), "mine\n");
}

TEST_F(MergeEdits, AreNotMissingFilesWhichComeBack)
{
    theyWrite({"theirs"});
    repository_.remove("other");
    repository_.remove("d");
    merge("topic");
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(MergeEdits, ThatGitHidesAreRefusedWhateverTheyDoToTheFile)
{
    const std::string start = idOf("main");
    for (const std::string option : {"skip-worktree", "assume-unchanged"})
    {
        for (const auto &change : {writes("d/g", "theirs\n"), removes("d/g"), writes("d/n", "x")})
        {
            diverge(writes("ours", "x"), writes("theirs", "x") + change);
            repository_.git({"update-index", "--" + option, "d/g"});
            repository_.write("d/g", "mine\n");
            expectMergeRefused(hiddenEdit("d/g", option));
            repository_.git({"update-index", "--no-" + option, "d/g"});
            repository_.git({"reset", "--quiet", "--hard", start});
            repository_.git({"branch", "--quiet", "-D", "topic"});
        }
    }
}

TEST_F(MergeEdits, AreNotHiddenFilesThatAreAsCommittedOrMissing)
{
    theyWrite({"d/g", "theirs"});
    repository_.commitAll(links("d", "link"), "link");
    repository_.git({"update-index", "--skip-worktree", "d/f", "other", "link"});
    repository_.git({"update-index", "--assume-unchanged", "d/g"});
    repository_.remove("other");
    merge("topic");
    EXPECT_EQ(repository_.read("d/g"), "theirs\n");
}

TEST_F(MergeEdits, MayBeWhateverIsInThePlaceOfAHiddenFile)
{
    theyWrite({"theirs"});
    repository_.git({"update-index", "--skip-worktree", "d/f"});
    for (const auto &change :
         {removes("d/f") + links("f\n", "d/f"), removes("d/f") + makesFifo("d/f"),
          removes("d/f") + writes("d/f/mine", "mine\n"), removes("d") + links("../outside", "d")})
    {
        change(repository_);
        expectMergeRefused(hiddenEdit("d/f", "skip-worktree"));
    }
}

TEST_F(MergeEdits, AreNotChangesInASubmodule)
{
    addModule();
    theyWrite({"theirs"});
    GitRepository module(repository_ / "module");
    module.write("untracked", "mine\n");
    module.commitAll("mine");
    const std::string id = module.line({"rev-parse", "HEAD"});
    merge("topic");
    EXPECT_EQ(module.line({"rev-parse", "HEAD"}), id);
    EXPECT_EQ(module.read("untracked"), "mine\n");
}

TEST_F(MergeEdits, AreFilesInThePlaceOfASubmodule)
{
    addModule();
    theyWrite({"theirs"});
    expectEachRefused({{removes("module") + writes("module", "mine\n"), edited("module")}});
}

TEST_F(MergeEdits, AreSubmodulesThatBecomeAFile)
{
    addModule();
    diverge(writes("ours", "x"), runsGit({"rm", "--quiet", "--cached", "module"}) +
                                     removes("module") + writes("module", "theirs\n"));
    repository_.git({"submodule", "--quiet", "update", "--init"});
    repository_.write("module/mine", "mine\n");
    expectMergeRefused(inTheWay("folder 'module'"));
}

} // namespace
