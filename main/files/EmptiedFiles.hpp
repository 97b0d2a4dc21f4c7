// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <git2/strarray.h>
#include <git2/types.h>

namespace vclink::git
{

/// Before libgit2 1.6, git_index_update_all and git_index_add_all end the process if a tracked file
/// is empty now and is converted as it is read, by line ends or `ident`. Both compare the text of
/// every modified tracked file, listed or not, and free a static buffer for such a file. These
/// functions prevent the comparison: a file that is staged by its path needs none. With later
/// releases they do nothing.
///
/// They do not help if another program empties a file after they have checked it.

/// Call before git_index_update_all. Stages all empty files that are tracked and modified, in
/// memory. git_index_add_bypath.
/// @throws LibGit2Exception
void stageEmptiedFiles(git_repository *repository, git_index *index);

/// For git_index_add_all, which stages listed files only.
class EmptiedFiles
{
  public:
    /// Stages the listed files that are empty now, in memory. Sets the assume-unchanged flag of the
    /// others, also in memory: do not write the index before giveBack(). git_pathspec_matches_path,
    /// git_index_add_bypath.
    /// @throws LibGit2Exception
    EmptiedFiles(git_repository *repository, git_index *index, const git_strarray &listed);

    /// Clears the flags that the constructor set.
    void giveBack(git_index *index) const noexcept;

  private:
    std::vector<std::string> held_;
};

} // namespace vclink::git
