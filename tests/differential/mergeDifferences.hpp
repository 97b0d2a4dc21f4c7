// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <set>
#include <string>
#include <vector>

#include "MergeHistory.hpp"
#include "support/GitRepository.hpp"
#include "support/RepositoryState.hpp"

namespace vclink::test
{

/// What a merge left of one path, and of the names that a side of it got for want of room:
/// "path~HEAD" and "path~<id>".
struct MergedPath
{
    /// Mode, id and stage of each entry in the index, and the names that the entries have there.
    std::multiset<std::string> entries;
    std::set<std::string> entryNames;
    /// Names and contents in the working tree.
    RepositoryState::Entries files;
};
bool operator==(const MergedPath &left, const MergedPath &right);
bool operator!=(const MergedPath &left, const MergedPath &right);

/// The index and the working tree after a merge, by path. Folders count where they are empty.
using MergedPaths = std::map<std::string, MergedPath>;
MergedPaths readMergedPaths(const GitRepository &repository, const MergeCommit &merge);

/// The paths that two merges made of differ in.
std::set<std::string> findDifferences(const MergedPaths &left, const MergedPaths &right);
std::string describe(const MergedPaths &paths, const std::string &path);

/// What explains that libgit2 merges some paths otherwise than git. Read from the commits, with
/// git's own rename detection.
class MergeExplanations
{
  public:
    MergeExplanations(const GitRepository &repository, const MergeCommit &merge);

    /// The name of the rule that explains the difference in one path; empty where none does.
    std::string explain(const std::string &path, const MergedPaths &byLibrary,
                        const MergedPaths &byGit) const;
    /// Whether one side has renamed a file to this name, and the other has a folder there.
    bool isRenamedOntoFolder(const std::string &path) const;
    /// Whether both sides have a file there that is no link, so that lines may be compared.
    bool hasTwoFiles(const std::string &path) const;

  private:
    using Files = std::map<std::string, std::string>;

    static Files listFiles(const GitRepository &repository, const std::string &commit);
    void addRenames(const GitRepository &repository, const std::string &base,
                    const std::string &side);
    bool isFolderInTheWay(const std::string &path) const;
    bool isOfTwoTypes(const std::string &path) const;
    bool isAddedWithTwoModes(const std::string &path) const;
    /// Whether each entry is one that a side has somewhere, so that none is a result.
    bool areSidesAsTheyWere(const std::multiset<std::string> &entries) const;
    bool isAnotherInEachBase(const std::string &path) const;

    /// The mode and id by path, for each merge base, ours and theirs.
    std::vector<Files> bases_;
    Files ours_;
    Files theirs_;
    std::set<std::string> renamed_;
};

} // namespace vclink::test
