// SPDX-License-Identifier: MIT
#include "main/files/EmptiedFiles.hpp"

#include <string>

#include <git2/index.h>
#include <git2/repository.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/libgit2Release.hpp"
#include "util/path/foldersAbove.hpp"
#include "util/repository/objectIds.hpp"

namespace vclink::git
{
namespace
{

constexpr bool endsAtEmptiedFiles = !isLibGit2Since(1, 6);

/// Whether libgit2 would fail at the empty file, or leave the mark of `git add --intent-to-add`.
bool isLeft(git_index *index, const ChangedFile &file)
{
    const git_index_entry *const entry =
        git_index_get_bypath(index, file.path.c_str(), GIT_INDEX_STAGE_NORMAL);
    if (entry != nullptr && (entry->flags_extended & GIT_INDEX_ENTRY_INTENT_TO_ADD) != 0)
    {
        return true;
    }
    const bool isStaged = entry != nullptr && isEmptyBlob(entry->id) && entry->mode == file.mode;
    return endsAtEmptiedFiles && !isStaged;
}

} // namespace

void stageEmptiedFiles(git_repository *repository, git_index *index,
                       const std::vector<ChangedFile> &files)
{
    for (const ChangedFile &file : files)
    {
        if (file.isEmpty && isLeft(index, file) &&
            !hasLinkAbove(git_repository_workdir(repository), file.path))
        {
            check(git_index_add_bypath, index, file.path.c_str());
        }
    }
}

} // namespace vclink::git
