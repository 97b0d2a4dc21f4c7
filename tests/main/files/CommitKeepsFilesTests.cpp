// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <vector>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "CommitFixture.hpp"

namespace
{

using testing::AllOf;
using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::IsSupersetOf;
using namespace vclink::test;

/// A commit of a working copy in which some tracked files stand nowhere because they are not
/// checked out. "in" and "out" are folders; "out" is what is left out.
class SparseCommit : public CommitFixture
{
  protected:
    SparseCommit()
    {
        for (const auto *name : {"in/one", "in/two", "out/one", "out/deep/two"})
            repository_.write(name, std::string("content of ") + name + "\n");
        repository_.commitAll("folders");
    }

    void leaveOut() const
    {
        repository_.git({"sparse-checkout", "set", "--cone", "--no-sparse-index", "in"});
        ASSERT_THAT(entries(), AllOf(Contains("S out/one"), Contains("S out/deep/two")));
        ASSERT_FALSE(std::filesystem::exists(repository_ / "out"));
    }
    /// `git ls-files -t`: "H" of a file that is checked out, "S" of one that is not.
    std::vector<std::string> entries() const
    {
        return split(repository_.git({"ls-files", "-t"}));
    }
    /// Begins a merge with a branch that changes these files, as ours does.
    void beginMergeOf(const std::vector<std::string> &ours, const std::vector<std::string> &theirs)
    {
        const auto commitSide = [this](const std::vector<std::string> &names, const char *side)
        {
            for (const auto &name : names)
                repository_.write(name, side);
            repository_.commitAll(side);
        };
        repository_.git({"branch", "theirs"});
        commitSide(ours, "ours\n");
        repository_.git({"checkout", "--quiet", "theirs"});
        commitSide(theirs, "theirs\n");
        repository_.git({"checkout", "--quiet", "main"});
        leaveOut();
        EXPECT_FALSE(repository_.tryGit({"merge", "--quiet", "theirs"}).succeeded());
    }
};

TEST_F(SparseCommit, KeepsWhatAConeLeavesOut)
{
    leaveOut();
    repository_.write("in/one", "changed\n");
    const auto before = entries();
    commit();
    EXPECT_THAT(namesIn(), ElementsAre("file", "in/one", "in/two", "other", "out/deep/two",
                                       "out/one", "sub/inside"));
    EXPECT_EQ(committed("in/one"), "changed\n");
    EXPECT_EQ(committed("out/one"), "content of out/one\n");
    EXPECT_EQ(idOf("HEAD:out"), idOf("HEAD^:out"));
    EXPECT_EQ(entries(), before);
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(SparseCommit, KeepsWhatPatternsLeaveOut)
{
    repository_.git({"sparse-checkout", "set", "--no-cone", "/in/", "/file", "!/in/two"});
    const auto before = entries();
    ASSERT_THAT(before, ElementsAre("H file", "H in/one", "S in/two", "S other", "S out/deep/two",
                                    "S out/one", "S sub/inside"));
    repository_.write("in/one", "changed\n");
    commit();
    EXPECT_EQ(split(repository_.git({"diff", "--name-status", "HEAD^", "HEAD"})),
              std::vector<std::string>{"M\tin/one"});
    EXPECT_EQ(entries(), before);
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(SparseCommit, DropsAFileThatIsDeletedBesideThem)
{
    leaveOut();
    repository_.remove("in/one");
    repository_.remove("file");
    commit();
    EXPECT_EQ(split(repository_.git({"diff", "--name-status", "HEAD^", "HEAD"})),
              (std::vector<std::string>{"D\tfile", "D\tin/one"}));
    EXPECT_THAT(entries(),
                ElementsAre("H in/two", "H other", "S out/deep/two", "S out/one", "S sub/inside"));
    EXPECT_THAT(status(), IsEmpty());
}

TEST_F(SparseCommit, KeepsTheIndexEntriesWholeAndCanBeUndone)
{
    leaveOut();
    const auto whole = [this] { return indexOf(repository_); };
    const auto before = whole();
    commit();
    commit();
    EXPECT_EQ(whole(), before);
    repository_.remove("in/one");
    commit();
    auto without = before;
    without.erase("in/one");
    EXPECT_EQ(whole(), without);
    repository_.git({"sparse-checkout", "disable"});
    EXPECT_EQ(repository_.read("out/one"), "content of out/one\n");
    EXPECT_THAT(status(), IsEmpty());
    EXPECT_EQ(repository_.git({"fsck", "--strict", "--no-dangling"}), "");
}

TEST_F(SparseCommit, OfEverythingLeftOutKeepsTheTree)
{
    repository_.git({"sparse-checkout", "set", "--no-cone", "/nothing"});
    const std::string tree = idOf("HEAD^{tree}");
    commit();
    EXPECT_EQ(idOf("HEAD^{tree}"), tree);
    EXPECT_THAT(entries(), testing::Each(testing::StartsWith("S ")));
}

TEST_F(SparseCommit, KeepsASingleFileThatIsMarked)
{
    repository_.git({"update-index", "--skip-worktree", "file"});
    repository_.remove("file");
    commit();
    EXPECT_EQ(committed("file"), "content of file\n");
    EXPECT_THAT(entries(), Contains("S file"));
}

TEST_F(SparseCommit, KeepsASubmoduleThatIsLeftOut)
{
    auto source = makeRepository("source");
    const std::string id = source.commit("first");
    repository_.git({"submodule", "--quiet", "add", source.path().string(), "out/module"});
    repository_.commit("with a module");
    repository_.git({"submodule", "--quiet", "deinit", "--force", "out/module"});
    leaveOut();
    ASSERT_THAT(entries(), Contains("S out/module"));
    commit();
    EXPECT_EQ(idOf("HEAD:out/module"), id);
    EXPECT_THAT(entries(), Contains("S out/module"));
}

TEST_F(SparseCommit, OfAMergeKeepsWhatIsLeftOut)
{
    beginMergeOf({"in/one"}, {"in/one", "out/deep/two"});
    commit();
    EXPECT_NE(committed("in/one").find("<<<<<<<"), std::string::npos);
    EXPECT_EQ(committed("out/one"), "content of out/one\n");
    EXPECT_EQ(committed("out/deep/two"), "theirs\n");
    EXPECT_THAT(entries(), IsSupersetOf({"H in/one", "S out/deep/two", "S out/one"}));
    EXPECT_EQ(parents().size(), 2U);
}

/// git checks the one file out, conflict markers and all.
TEST_F(SparseCommit, OfAMergeTakesAConflictInWhatIsLeftOut)
{
    beginMergeOf({"out/one"}, {"out/one"});
    const std::string standing = repository_.read("out/one");
    commit();
    EXPECT_EQ(committed("out/one"), standing);
    EXPECT_EQ(committed("out/deep/two"), "content of out/deep/two\n");
    EXPECT_THAT(entries(), IsSupersetOf({"H out/one", "S out/deep/two"}));
}

TEST_F(SparseCommit, OfAMergeDropsAConflictWhereNoFileStandsAndNothingElse)
{
    beginMergeOf({"in/one", "out/one"}, {"in/one", "out/one"});
    repository_.remove("out");
    repository_.remove("in/one");
    commit();
    EXPECT_THAT(namesIn(), ElementsAre("file", "in/two", "other", "out/deep/two", "sub/inside"));
    EXPECT_THAT(entries(), Contains("S out/deep/two"));
}

/// As git: in a partial clone what is left out may never have been fetched.
TEST_F(SparseCommit, NeedsNothingFromTheStoreOfAFolderLeftOut)
{
    leaveOut();
    const std::string id = idOf("HEAD:out/one");
    const std::string folder = idOf("HEAD:out");
    repository_.remove(".git/objects/" + id.substr(0, 2) + "/" + id.substr(2));
    repository_.write("in/one", "changed\n");
    commit();
    EXPECT_EQ(idOf("HEAD:out"), folder);
    EXPECT_EQ(committed("in/one"), "changed\n");
    EXPECT_THAT(entries(), Contains("S out/one"));
}

TEST_F(SparseCommit, FailsWhereItHasToWriteATreeWithAFileThatIsMissingInTheStore)
{
    leaveOut();
    repository_.git({"update-index", "--skip-worktree", "other"});
    repository_.remove("other");
    const std::string id = idOf("HEAD:other");
    repository_.remove(".git/objects/" + id.substr(0, 2) + "/" + id.substr(2));
    repository_.write("in/one", "changed\n");
    const std::string head = idOf("HEAD");
    EXPECT_NE(failureOf([this] { commit(); }).code, 0);
    EXPECT_EQ(idOf("HEAD"), head);
    EXPECT_EQ(repository_.read("in/one"), "changed\n");
}

/// A commit of a working copy in which what was a folder is none any more.
class ReplacedFolderCommit : public CommitFixture
{
  protected:
    ReplacedFolderCommit()
    {
        std::filesystem::rename(repository_ / "sub", repository_ / "moved");
    }
};

TEST_F(ReplacedFolderCommit, DropsWhatWasInAFolderThatIsAFileOrALinkNow)
{
    const std::string head = idOf("HEAD");
    for (const bool isLink : {false, true})
    {
        if (isLink)
            repository_.symlink("moved", "sub");
        else
            repository_.write("sub", "x");
        commit();
        EXPECT_THAT(namesIn(), ElementsAre("file", "other"));
        EXPECT_THAT(status(), ElementsAre("?? moved/inside", "?? sub"));
        repository_.remove("sub");
        repository_.git({"reset", "--quiet", head});
    }
}

/// git can't tell either.
TEST_F(ReplacedFolderCommit, IsRefusedOverALinkToItself)
{
    repository_.symlink("sub", "sub");
    const NothingChanges nothing(repository_);
    EXPECT_EQ(failureOf([this] { commit(); }).text,
              "could not read 'sub/inside', which is tracked: Too many levels of symbolic links");
}

TEST_F(ReplacedFolderCommit, KeepsWhatIsInAFolderThatIsARepositoryNow)
{
    std::filesystem::rename(repository_ / "moved", repository_ / "sub");
    GitRepository::init(repository_ / "sub");
    repository_.write("sub/inside", "changed\n");
    commit();
    EXPECT_EQ(committed("sub/inside"), "changed\n");
}

} // namespace
