// SPDX-License-Identifier: MIT
#include "main/files/prepareAddition.hpp"

#include <algorithm>
#include <cstdint>
#include <iterator>
#include <memory>
#include <string>
#include <vector>

#include <git2/index.h>
#include <git2/pathspec.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/files/ChangedFiles.hpp"
#include "main/files/EmptiedFiles.hpp"
#include "main/files/stageChangedFiles.hpp"

namespace vclink::git
{
namespace
{

/// Patterns that are read once.
class ListedFiles
{
  public:
    ListedFiles(git_index *index, const git_strarray &listed)
    {
        git_pathspec *raw = nullptr;
        const GitResult<void> made = call(git_pathspec_new, &raw, &listed);
        pathspec_.reset(raw);
        check(made);
        const bool isCaseIgnored = (git_index_caps(index) & GIT_INDEX_CAPABILITY_IGNORE_CASE) != 0;
        flags_ = isCaseIgnored ? GIT_PATHSPEC_IGNORE_CASE : GIT_PATHSPEC_DEFAULT;
    }

    bool contain(const std::string &path) const
    {
        return git_pathspec_matches_path(pathspec_.get(), flags_, path.c_str()) != 0;
    }

  private:
    std::unique_ptr<git_pathspec, void (*)(git_pathspec *)> pathspec_{nullptr, git_pathspec_free};
    std::uint32_t flags_ = GIT_PATHSPEC_DEFAULT;
};

} // namespace

void prepareAddition(git_repository *repository, git_index *index, const git_strarray &listed,
                     HeldEntries &held)
{
    const ChangedFiles changed(repository, index);
    if (changed.files().empty())
    {
        return;
    }
    const ListedFiles names(index, listed);
    std::vector<ChangedFile> toStage;
    std::vector<ChangedFile> others;
    std::partition_copy(changed.files().begin(), changed.files().end(), std::back_inserter(toStage),
                        std::back_inserter(others),
                        [&names](const ChangedFile &file) { return names.contain(file.path); });
    stageChangedFiles(repository, index, changed, toStage, held);
    stageEmptiedFiles(repository, index, toStage);
    for (const ChangedFile &file : others)
    {
        held.hold(index, file.path);
    }
}

} // namespace vclink::git
