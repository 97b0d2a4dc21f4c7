// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <string>
#include <vector>

#include <git2/index.h>
#include <git2/oid.h>
#include <git2/tree.h>
#include <git2/types.h>

#include "main/checkout/Obstacle.hpp"
#include "main/checkout/WorkingCopy.hpp"
#include "main/checkout/treeChanges.hpp"

namespace vclink::git
{

/// A rule of a merge: finds a name that is the name of a file in conflict with ".lock" appended,
/// e.g. "Gemfile.lock". libgit2 uses this name for its temporary file while it writes the conflict,
/// and would fail in the middle of its writing. For files that a rename combines, see RenamedLocks.
/// @param theirs the other side's tree, which can add such a name
/// @throws LibGit2Exception
Finding findLockOfConflict(git_repository *repository, WorkingCopy &copy, const TreeChange &change,
                           const git_tree *theirs);

/// Finds such a name beside any file that both sides have, and have differently.
/// @param change from our side to theirs
/// @throws LibGit2Exception
Finding findLockBesideFile(WorkingCopy &copy, const TreeChange &change, const git_tree *theirs);

/// The same rule for a file that one side has renamed and the other has changed. There it also
/// finds folders that cannot be written to, because libgit2 removes the file and
/// creates it again, and files that libgit2 may take for the renamed one by mistake: before
/// 1.8 empty ones, and several with the same content of which one changes its last name.
class RenamedLocks
{
  public:
    /// Notes a file that may have been renamed: one side has deleted it, the other has changed it.
    void note(WorkingCopy &copy, const TreeChange &change);

    /// Compares each noted file with the files that the other side has added beside such a name.
    /// Reads the trees only if there is anything noted.
    /// @param before the tree of a merge base, null for the empty tree
    /// @throws LibGit2Exception
    Finding find(git_repository *repository, WorkingCopy &copy, const git_tree *before,
                 const git_tree *theirs) const;

  private:
    struct File
    {
        std::string path;
        git_oid id;
        git_filemode_t mode;
    };
    struct Candidate
    {
        File before;
        File changed;
    };
    /// What one side has done with the files of a candidate's content, in path order.
    struct Moves
    {
        std::string changed;
        std::vector<std::string> deleted;
        std::vector<std::string> added;
    };
    using Contents = std::map<std::string, Moves>;

    static Contents contentsOf(const std::vector<Candidate> &candidates);
    static void noteMove(Contents &contents, const TreeChange &change);
    static git_index_entry entryFor(const File &file);
    static bool isInConflict(git_repository *repository, const TreeChange &change,
                             const std::vector<Candidate> &candidates);
    static Finding findEmptied(const TreeChange &change, const std::vector<Candidate> &candidates);
    static Finding findUnclear(const Contents &contents);
    static Finding findIn(git_repository *repository, WorkingCopy &copy, const git_tree *before,
                          const git_tree *renaming, const git_tree *theirs,
                          const std::vector<Candidate> &candidates);

    std::vector<Candidate> deletedByOurs_;
    std::vector<Candidate> deletedByTheirs_;
};

} // namespace vclink::git
