// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>

#include <git2.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "CommitFixture.hpp"

namespace
{

namespace fs = std::filesystem;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::StartsWith;
using namespace vclink::test;

const std::string missingId = "1234567890123456789012345678901234567890";

/// A working copy in which "file" is changed, "other" deleted and "new" untracked.
class CommitFailure : public CommitFixture
{
  protected:
    CommitFailure()
    {
        change();
    }

    void change() const
    {
        repository_.write("file", "changed\n");
        repository_.remove("other");
        repository_.write("new", "x");
    }
    Failure failure() const
    {
        return failureOf([this] { commit(); });
    }
    /// What is left by a failure after the index was written.
    RepositoryState refreshed() const
    {
        RepositoryState state = stateOf(repository_);
        state.index = stateAfterGit({{"add", "--update"}}).index;
        return state;
    }
    /// Expects a commit to fail while a file of git's folder holds other bytes, to leave these, and
    /// to have refreshed the index.
    void expectFailsWith(const std::string &name, const std::string &bytes,
                         const Failure &expected) const
    {
        const std::string before = repository_.read(name);
        const RepositoryState state = refreshed();
        repository_.write(name, bytes);
        EXPECT_EQ(failure(), expected);
        EXPECT_EQ(repository_.read(name), bytes);
        repository_.write(name, before);
        EXPECT_EQ(stateOf(repository_), state);
    }
};

/// One that can't be told has no parent for the commit, which then does not follow the branch's.
TEST_F(CommitFailure, OfAHeadOrABranchThatNamesNoCommitIsToldWhenTheCommitIsMade)
{
    const std::string head = ".git/HEAD";
    const std::string branch = ".git/refs/heads/main";
    const auto reference = [](int code, const std::string &text) {
        return Failure{code, GIT_ERROR_REFERENCE, text};
    };
    const auto corrupted = [&](const std::string &name)
    { return reference(GIT_ERROR, "corrupted loose reference file: " + name); };
    const Failure noParent{GIT_EMODIFIED, GIT_ERROR_OBJECT,
                           "failed to create commit: current tip is not the first parent"};
    expectFailsWith(head, "garbage\n", corrupted("HEAD"));
    expectFailsWith(head, "", corrupted("HEAD"));
    expectFailsWith(branch, "garbage\n", corrupted("refs/heads/main"));
    expectFailsWith(branch, missingId + '\n', noParent);
    expectFailsWith(head, missingId + '\n', noParent);
    expectFailsWith(branch, idOf("HEAD^{tree}") + '\n', noParent);
    expectFailsWith(head, "ref: refs/heads\n",
                    reference(GIT_EDIRECTORY, "cannot lock ref 'refs/heads', there are refs "
                                              "beneath that folder"));
    expectFailsWith(head, "ref: HEAD\n",
                    reference(GIT_ERROR, "cannot resolve reference (>10 levels deep)"));
}

TEST_F(CommitFailure, OfALockedBranchLeavesTheRefreshInTheIndex)
{
    const RepositoryState state = refreshed();
    repository_.write(".git/refs/heads/main.lock", "");
    const Failure locked = failure();
    EXPECT_EQ(locked.code, GIT_ELOCKED);
    EXPECT_EQ(locked.errorClass, GIT_ERROR_OS);
    EXPECT_THAT(locked.text, StartsWith("failed to lock file '" +
                                        (repository_ / ".git/refs/heads/main.lock").string()));
    EXPECT_EQ(stateOf(repository_), state);
    EXPECT_THAT(status(), ElementsAre("M  file", "D  other", "?? new"));
    repository_.remove(".git/refs/heads/main.lock");
    commit();
    EXPECT_THAT(namesIn(), ElementsAre("file", "sub/inside"));
}

TEST_F(CommitFailure, OfALockedBranchLeavesAMergeUnderWay)
{
    repository_.git({"reset", "--quiet", "--hard"});
    beginMerge({"file"});
    repository_.remove("other");
    const RepositoryState state = refreshed();
    repository_.write(".git/refs/heads/main.lock", "");
    EXPECT_EQ(failure().code, GIT_ELOCKED);
    EXPECT_EQ(stateOf(repository_), state);
    EXPECT_EQ(repository_.read(".git/MERGE_HEAD"), idOf("theirs") + '\n');
    EXPECT_EQ(state.index.count("other"), 0U);
    repository_.remove(".git/refs/heads/main.lock");
    commit();
    EXPECT_EQ(parents().size(), 2U);
}

TEST_F(CommitFailure, OfALockedIndexChangesNothingAndLeavesTheLock)
{
    repository_.write(".git/index.lock", "of another process");
    {
        const NothingChanges nothing(repository_);
        EXPECT_EQ(failure(),
                  (Failure{GIT_ELOCKED, GIT_ERROR_INDEX,
                           "the index is locked by '" + (repository_ / ".git/index.lock").string() +
                               "'; this might be due to a concurrent or crashed process"}));
        EXPECT_EQ(states(repository_, {"file", "other"}),
                  (States{{"file", "Modified"}, {"other", "Missing"}}));
    }
    EXPECT_EQ(repository_.read(".git/index.lock"), "of another process");
    repository_.remove(".git/index.lock");
    commit();
    EXPECT_THAT(namesIn(), ElementsAre("file", "sub/inside"));
}

/// "file" is staged in memory when "sub/inside" is met.
TEST_F(CommitFailure, HalfWayThroughTheRefreshLeavesTheIndexUnwritten)
{
    repository_.git({"config", "core.autocrlf", "true"});
    repository_.git({"config", "core.safecrlf", "true"});
    repository_.write("file", "one\r\ntwo\r\n");
    repository_.write("sub/inside", "one\r\ntwo\n");
    const NothingChanges nothing(repository_);
    EXPECT_EQ(failure(), (Failure{GIT_ERROR, GIT_ERROR_FILTER,
                                  "LF would be replaced by CRLF in 'sub/inside'"}));
}

TEST_F(CommitFailure, OfABrokenIndexLeavesItAsItIs)
{
    const std::string index = repository_.read(".git/index");
    const std::string head = idOf("HEAD");
    repository_.write(".git/index", notAnIndex);
    EXPECT_EQ(failure(), (Failure{GIT_ERROR, GIT_ERROR_INDEX,
                                  "invalid data in index - incorrect header signature"}));
    EXPECT_EQ(repository_.read(".git/index"), notAnIndex);
    EXPECT_EQ(idOf("HEAD"), head);
    repository_.write(".git/index", index.substr(0, index.size() / 2));
    EXPECT_EQ(failure().errorClass, GIT_ERROR_INDEX);
    EXPECT_EQ(idOf("HEAD"), head);
}

TEST_F(CommitFailure, OfAnIndexInAFormThatLibGit2DoesNotKnowChangesNothing)
{
    const auto unsupported = [](const std::string &extension)
    {
        return Failure{GIT_ERROR, GIT_ERROR_INDEX,
                       "unsupported mandatory extension: '" + extension + "'"};
    };
    const auto split = GitRepository::clone(repository_.path(), folder() / "split");
    configureIdentity(split);
    split.git({"update-index", "--split-index"});
    {
        const NothingChanges nothing(split);
        EXPECT_EQ(failureOf([&] { commitIn(split); }), unsupported("link"));
    }
    const auto sparse = GitRepository::clone(repository_.path(), folder() / "sparse");
    configureIdentity(sparse);
    sparse.git({"sparse-checkout", "set", "--cone", "--sparse-index", "nothing"});
    const NothingChanges nothing(sparse);
    EXPECT_EQ(failureOf([&] { commitIn(sparse); }), unsupported("sdir"));
}

TEST_F(CommitFailure, OfABareRepositoryIsToldByTheRefresh)
{
    const std::string bare = folder() / "bare";
    repository_.git({"clone", "--quiet", "--bare", repository_.path().string(), bare});
    const GitRepository cloned(bare);
    configureIdentity(cloned);
    const std::string head = cloned.line({"rev-parse", "HEAD"});
    EXPECT_EQ(failureOf([&] { commitIn(cloned); }).code, GIT_EBAREREPO);
    EXPECT_EQ(cloned.line({"rev-parse", "HEAD"}), head);
}

TEST_F(CommitFailure, OfAFolderThatIsNoRepositoryIsRaised)
{
    fs::create_directory(folder() / "plain");
    for (const auto *name : {"missing", "plain"})
    {
        const GitRepository none(folder() / name);
        EXPECT_EQ(failureOf([&] { commitIn(none); }).code, GIT_ENOTFOUND);
    }
    EXPECT_TRUE(fs::is_empty(folder() / "plain"));
}

/// The same working copy, of a user who may not write all of git's folder.
class ForbiddenCommit : public CommitFailure
{
  protected:
    ForbiddenCommit()
    {
        giveAway();
    }

    /// Commits while all folders from this one downwards can't be written.
    std::string commitWithoutWriting(const std::string &name) const
    {
        setFolderModes(name, 0555);
        const std::string outcome = commitAsItsOwner();
        setFolderModes(name, 0755);
        return outcome;
    }
    /// Commits while a file can't be read.
    std::string commitWithoutReading(const std::string &name) const
    {
        repository_.setMode(name, 0000);
        const std::string outcome = commitAsItsOwner();
        repository_.setMode(name, 0644);
        return outcome;
    }

  private:
    void setFolderModes(const std::string &name, unsigned mode) const
    {
        const auto set = [mode](const fs::path &path) { fs::permissions(path, fs::perms(mode)); };
        set(repository_ / name);
        for (const auto &entry : fs::recursive_directory_iterator(repository_ / name))
        {
            if (entry.is_directory())
                set(entry.path());
        }
    }
};

TEST_F(ForbiddenCommit, ToAStoreChangesNothingWhereAFileIsToBeStored)
{
    const NothingChanges nothing(repository_);
    EXPECT_THAT(commitWithoutWriting(".git/objects"),
                testing::AllOf(StartsWith("-1 2 failed to create temporary file '"),
                               HasSubstr("Permission denied")));
}

TEST_F(ForbiddenCommit, ToAStoreLeavesTheRefreshInTheIndexWhereOnlyTheTreeIsToBeStored)
{
    repository_.git({"add", "file"});
    giveAway();
    const RepositoryState state = refreshed();
    EXPECT_THAT(commitWithoutWriting(".git/objects"),
                StartsWith("-1 2 failed to create temporary file '"));
    EXPECT_EQ(stateOf(repository_), state);
    EXPECT_THAT(status(), ElementsAre("M  file", "D  other", "?? new"));
}

TEST_F(ForbiddenCommit, ToABranchLeavesTheRefreshInTheIndex)
{
    const RepositoryState state = refreshed();
    EXPECT_EQ(commitWithoutWriting(".git/refs/heads"),
              "-1 2 failed to create locked file '" +
                  (repository_ / ".git/refs/heads/main.lock").string() + "': Permission denied");
    EXPECT_EQ(stateOf(repository_), state);
}

TEST_F(ForbiddenCommit, ToTheFolderOfTheIndexChangesNothing)
{
    const NothingChanges nothing(repository_);
    repository_.setMode(".git", 0555);
    EXPECT_EQ(commitAsItsOwner(), "-1 2 failed to create locked file '" +
                                      (repository_ / ".git/index.lock").string() +
                                      "': Permission denied");
    repository_.setMode(".git", 0755);
}

TEST_F(ForbiddenCommit, WithAnIndexThatCannotBeReadChangesNothing)
{
    const RepositoryState state = stateOf(repository_);
    EXPECT_THAT(commitWithoutReading(".git/index"), StartsWith("-1 10 failed to read index: '"));
    EXPECT_EQ(stateOf(repository_), state);
}

TEST_F(ForbiddenCommit, OnABranchThatCannotBeReadIsToldWhenTheCommitIsMade)
{
    const RepositoryState state = refreshed();
    EXPECT_EQ(commitWithoutReading(".git/refs/heads/main"),
              "-14 2 failed open - '" + (repository_ / ".git/refs/heads/main").string() +
                  "' is locked: Permission denied");
    EXPECT_EQ(stateOf(repository_), state);
}

/// The commit exists, and so does what could not be removed.
TEST_F(ForbiddenCommit, ThatCannotEndWhatIsUnderWayLeavesTheCommit)
{
    repository_.write(".git/sequencer/todo", "");
    giveAway();
    const std::string head = idOf("HEAD");
    EXPECT_EQ(commitWithoutWriting(".git/sequencer"),
              "-14 2 failed remove - '" + (repository_ / ".git/sequencer/todo").string() +
                  "' is locked: Permission denied");
    EXPECT_THAT(parents(), ElementsAre(head));
    EXPECT_THAT(namesIn(), ElementsAre("file", "sub/inside"));
    EXPECT_TRUE(fs::exists(repository_ / ".git/sequencer/todo"));
}

} // namespace
