// SPDX-License-Identifier: MIT
#pragma once

#include <iosfwd>
#include <string>
#include <vector>

#include "main/branches/BranchFixture.hpp"

namespace vclink::test
{

/// What a merge came to, in a form that the library and git can be compared by. Words that differ
/// without meaning anything are left out: the labels of conflict markers, the reflog, messages.
struct MergeOutcome
{
    /// The ids of the parents of HEAD's commit, those of commits that both know.
    std::string parents;
    /// The tree of HEAD's commit.
    std::string tree;
    /// MERGE_HEAD while the merge is unfinished.
    std::string mergeHead;
    RepositoryState::Entries index;
    RepositoryState::Entries workingTree;
};

MergeOutcome outcomeIn(const GitRepository &repository);
bool operator==(const MergeOutcome &left, const MergeOutcome &right);
std::ostream &operator<<(std::ostream &stream, const MergeOutcome &outcome);

/// Base of the fixtures whose tests merge: "main" with the files "file" and "other" of one commit.
class MergeFixture : public BranchFixture
{
  protected:
    MergeFixture();

    void merge(const std::string &name) const
    {
        branches().merge(name);
    }
    /// The added text of the GitException that merge() throws. The test fails if it throws anything
    /// else, or another message than MergeFailed with the name as its only argument.
    std::string failureOfMerge(const std::string &name) const;
    /// failureOfMerge(), expecting the text of HasConflicts.
    void expectConflicts(const std::string &name) const;

    /// Has `ours` committed on main and `theirs` on the new branch "topic".
    void diverge(const Change &ours, const Change &theirs);
    /// Makes the branch "topic" with a commit that main does not have, of the file "new".
    void makeAhead();
    /// diverge() with a new file on either side, "ours" and "theirs".
    void makeDiverged();
    /// After diverge(): has each branch merge what the other has so far, so that there are two
    /// merge bases, and commit one more change.
    void crissCross(const Change &ours, const Change &theirs);
    /// Has the submodule "module" committed.
    /// @return the repository that it is cloned from, with one commit
    GitRepository addModule();
    /// A copy of the working copy as it is now, in the test's folder.
    GitRepository makeTwin() const;
    /// Sets `merge.ff`.
    void prefer(const std::string &value) const;
    /// What `git merge` makes of a twin.
    MergeOutcome outcomeByGit(const std::string &name) const;
    /// What the library makes of the working copy; conflicts are no failure.
    MergeOutcome outcomeByLibrary(const std::string &name) const;
    /// Expects both to come to the same.
    void expectAsGit(const std::string &name = "topic") const;

    /// Expects a merge commit as git has it, with nothing left under way.
    void expectCleanAsGit() const;
    /// Expects these conflicts, as git has them: stage and name.
    void expectConflictsAsGit(const std::vector<std::string> &expected) const;

    /// The lines of `git ls-files --unmerged` without the ids: stage and name.
    std::vector<std::string> conflicts() const;
    /// The message of the commit at HEAD, to the byte.
    std::string message() const;
    std::vector<std::string> parents() const;
};

} // namespace vclink::test
