// SPDX-License-Identifier: MIT
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "CommitFixture.hpp"

namespace
{

using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Not;
using namespace vclink::test;

class Commit : public CommitFixture
{
  protected:
    /// The mode of a file in the commit at HEAD.
    std::string modeOf(const std::string &name) const
    {
        return repository_.line({"ls-tree", "--format=%(objectmode)", "HEAD", name});
    }
};

TEST_F(Commit, HoldsWhatGitWouldStageOfTrackedFiles)
{
    repository_.commitAll(writes("again", "x"), "second");
    repository_.write("again", "staged\n");
    repository_.add({"again"});
    repository_.write("again", "changed since\n");
    repository_.write("file", "changed\n");
    repository_.remove("other");
    repository_.remove("sub");
    repository_.write("new", "x");
    const RepositoryState expected = stateAfterGit({{"add", "--update"}});
    commit();
    EXPECT_EQ(indexOf(repository_), expected.index);
    EXPECT_EQ(workingTreeOf(repository_), expected.workingTree);
    EXPECT_EQ(idOf("HEAD^{tree}"), repository_.line({"write-tree"}));
    EXPECT_EQ(committed("again"), "changed since\n");
    EXPECT_EQ(committed("file"), "changed\n");
    EXPECT_THAT(namesIn(), ElementsAre("again", "file"));
    EXPECT_THAT(status(), ElementsAre("?? new"));
    EXPECT_EQ(repository_.git({"fsck", "--strict", "--no-dangling"}), "");
}

/// The file's size and, within the file system's resolution, its time are the index's.
TEST_F(Commit, HoldsAFileThatChangedInTheSameMomentInWhichItWasStaged)
{
    repository_.write("file", "one\n");
    repository_.add({"file"});
    repository_.write("file", "two\n");
    commit();
    EXPECT_EQ(committed("file"), "two\n");
}

TEST_F(Commit, HoldsAFileThatIsIgnoredAndTracked)
{
    repository_.write(".git/info/exclude", "file\nsub/\n");
    repository_.write("file", "changed\n");
    repository_.write("sub/inside", "changed\n");
    commit();
    EXPECT_EQ(committed("file"), "changed\n");
    EXPECT_EQ(committed("sub/inside"), "changed\n");
}

/// git refuses to stage a pipe. What it held is lost to nobody.
TEST_F(Commit, DropsAFileInWhosePlaceAFolderOrAPipeStands)
{
    repository_.remove("file");
    repository_.write("file/new", "x");
    repository_.remove("other");
    ASSERT_EQ(Command({"mkfifo", repository_ / "other"}).run().exitStatus, 0);
    commit();
    EXPECT_THAT(namesIn(), ElementsAre("sub/inside"));
    EXPECT_THAT(status(), ElementsAre("?? file/new"));
}

TEST_F(Commit, DoesNotHoldAnUntrackedFile)
{
    for (const auto *name : {"new", "deep/new", "sub/new", "sub/deep/new"})
        repository_.write(name, "x");
    commit();
    EXPECT_THAT(namesIn(), ElementsAre("file", "other", "sub/inside"));
    EXPECT_THAT(status(), ElementsAre("?? deep/new", "?? new", "?? sub/deep/new", "?? sub/new"));
}

TEST_F(Commit, HoldsAFileOnceItOrItsNameIsAdded)
{
    repository_.write("new", "x");
    add({"new"});
    repository_.write("intended", "y");
    repository_.git({"add", "--intent-to-add", "intended"});
    commit();
    EXPECT_EQ(committed("new"), "x");
    EXPECT_EQ(committed("intended"), "y");
}

TEST_F(Commit, DoesNotHoldARemovedFileThatStillStands)
{
    remove({"file"});
    repository_.write("file", "untracked\n");
    commit();
    EXPECT_THAT(namesIn(), ElementsAre("other", "sub/inside"));
    EXPECT_EQ(repository_.read("file"), "untracked\n");
}

TEST_F(Commit, HoldsAnExecutableBit)
{
    repository_.setMode("file", 0755);
    commit();
    EXPECT_EQ(modeOf("file"), "100755");
    repository_.setMode("file", 0644);
    commit();
    EXPECT_EQ(modeOf("file"), "100644");
}

TEST_F(Commit, HoldsALinkAndNotItsTarget)
{
    repository_.remove("file");
    repository_.symlink("other", "file");
    commit();
    EXPECT_EQ(modeOf("file"), "120000");
    EXPECT_EQ(committed("file"), "other");
    repository_.remove("file");
    repository_.symlink("nowhere", "file");
    commit();
    EXPECT_EQ(committed("file"), "nowhere");
    repository_.remove("file");
    repository_.write("file", "a file again\n");
    commit();
    EXPECT_EQ(modeOf("file"), "100644");
}

TEST_F(Commit, HoldsLineEndingsAsTheAttributesWantThem)
{
    repository_.write(".gitattributes", "file text eol=crlf\n");
    repository_.write("file", "a\r\nb\r\n");
    repository_.write("other", "a\r\nb\r\n");
    commit();
    EXPECT_EQ(committed("file"), "a\nb\n");
    EXPECT_EQ(committed("other"), "a\r\nb\r\n");
    EXPECT_THAT(status(), ElementsAre("?? .gitattributes"));
}

TEST_F(Commit, HoldsTheCommitThatASubmoduleIsAt)
{
    addModule();
    GitRepository module(repository_ / "module");
    const std::string moved = module.commit("in the module");
    commit();
    EXPECT_EQ(idOf("HEAD:module"), moved);
    repository_.git({"submodule", "--quiet", "deinit", "--force", "module"});
    commit();
    EXPECT_EQ(idOf("HEAD:module"), moved) << "also where it is not checked out";
}

TEST_F(Commit, WithNothingChangedIsMadeWithTheSameTree)
{
    const std::string before = idOf("HEAD");
    commit();
    EXPECT_THAT(parents(), ElementsAre(before));
    EXPECT_EQ(idOf("HEAD^{tree}"), idOf(before + "^{tree}"));
    commit();
    EXPECT_EQ(repository_.line({"rev-list", "--count", "HEAD"}), "3");
}

TEST_F(Commit, MovesTheBranchAndNothingElse)
{
    repository_.git({"branch", "another"});
    repository_.git({"tag", "tag"});
    repository_.git({"pack-refs", "--all"});
    const std::string before = idOf("HEAD");
    commit("subject\n\nbody\n");
    const std::string after = idOf("HEAD");
    EXPECT_THAT(parents(), ElementsAre(before));
    EXPECT_EQ(repository_.line({"symbolic-ref", "HEAD"}), "refs/heads/main");
    EXPECT_THAT(split(repository_.git({"for-each-ref", "--format=%(refname) %(objectname)"})),
                ElementsAre("refs/heads/another " + before, "refs/heads/main " + after,
                            "refs/tags/tag " + before));
    EXPECT_EQ(repository_.line({"log", "--walk-reflogs", "-1", "--format=%gs", "main"}),
              "commit: subject");
}

TEST_F(Commit, OfAnEmptyRepositoryMakesItsBranchBorn)
{
    const auto empty = makeRepository("empty");
    configureIdentity(empty);
    empty.write("added", "x");
    empty.write("untracked", "x");
    empty.add({"added"});
    commitIn(empty);
    EXPECT_EQ(empty.line({"symbolic-ref", "HEAD"}), "refs/heads/main");
    EXPECT_EQ(empty.line({"rev-list", "--parents", "main"}), empty.line({"rev-parse", "HEAD"}));
    EXPECT_EQ(empty.git({"ls-tree", "-r", "--name-only", "HEAD"}), "added\n");
    EXPECT_EQ(empty.git({"status", "--porcelain"}), "?? untracked\n");
    EXPECT_EQ(empty.git({"fsck", "--strict"}), "");
}

TEST_F(Commit, OfARepositoryWithoutAnyFileHasTheEmptyTree)
{
    const auto empty = makeRepository("empty");
    configureIdentity(empty);
    commitIn(empty);
    EXPECT_EQ(empty.git({"ls-tree", "HEAD"}), "");
    EXPECT_EQ(empty.line({"rev-list", "--count", "HEAD"}), "1");
}

TEST_F(Commit, OnAnUnbornBranchBesideOthersHasNoParent)
{
    repository_.git({"checkout", "--quiet", "--orphan", "second"});
    const std::string main = idOf("main");
    commit();
    EXPECT_THAT(parents(), IsEmpty());
    EXPECT_EQ(repository_.line({"symbolic-ref", "HEAD"}), "refs/heads/second");
    EXPECT_THAT(namesIn(), ElementsAre("file", "other", "sub/inside"));
    EXPECT_EQ(idOf("main"), main);
}

TEST_F(Commit, OnADetachedHeadMovesHeadAlone)
{
    repository_.git({"checkout", "--quiet", "--detach"});
    const std::string before = idOf("HEAD");
    commit();
    EXPECT_THAT(parents(), ElementsAre(before));
    EXPECT_FALSE(repository_.tryGit({"symbolic-ref", "--quiet", "HEAD"}).succeeded());
    EXPECT_EQ(idOf("main"), before);
}

TEST_F(Commit, InALinkedWorktreeMovesThatOnesBranch)
{
    const std::string linked = folder() / "linked";
    repository_.git({"worktree", "add", "--quiet", "-b", "second", linked});
    const GitRepository worktree(linked);
    worktree.write("file", "changed\n");
    const std::string main = idOf("main");
    commitIn(worktree);
    EXPECT_EQ(worktree.line({"rev-parse", "HEAD^"}), main);
    EXPECT_EQ(worktree.git({"cat-file", "blob", "second:file"}), "changed\n");
    EXPECT_EQ(idOf("main"), main);
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(Commit, CoversTheWholeRootWhicheverFolderIsGiven)
{
    for (const std::string folder : {"", "/nowhere", "sub"})
    {
        repository_.write("file", "changed for " + folder + "\n");
        makeAdapter(repository_.path())->commit(asPath(folder), asUtf16("message"));
        EXPECT_EQ(committed("file"), "changed for " + folder + "\n");
    }
}

TEST_F(Commit, RunsNoHookAndSignsNothing)
{
    for (const auto *hook : {"pre-commit", "commit-msg", "post-commit"})
    {
        repository_.write(std::string(".git/hooks/") + hook, "#!/bin/sh\ntouch hooked\nexit 1\n");
        repository_.setMode(std::string(".git/hooks/") + hook, 0755);
    }
    repository_.git({"config", "commit.gpgSign", "true"});
    commit();
    EXPECT_THAT(status(), IsEmpty());
    EXPECT_THAT(split(repository_.git({"cat-file", "commit", "HEAD"})),
                Not(Contains(testing::StartsWith("gpgsig"))));
}

TEST_F(Commit, OfOneAdapterFollowsAnother)
{
    const auto adapter = makeAdapter(repository_.path());
    for (const std::string content : {"one", "two", "three"})
    {
        repository_.write("file", content);
        adapter->commit(upath(), asUtf16(content));
        EXPECT_EQ(committed("file"), content);
    }
    EXPECT_THAT(split(repository_.git({"log", "--format=%s"})),
                ElementsAre("three", "two", "one", "first"));
}

} // namespace
