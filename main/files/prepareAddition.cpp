// SPDX-License-Identifier: MIT
#include "main/files/prepareAddition.hpp"

#include <algorithm>
#include <iterator>
#include <string>
#include <vector>

#include <git2/index.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/files/EmptiedFiles.hpp"
#include "main/files/ListedFiles.hpp"
#include "main/files/stageChangedFiles.hpp"

namespace vclink::git
{

std::vector<ChangedFile> prepareAddition(git_repository *repository, git_index *index,
                                         const git_strarray &listed, HeldEntries &held)
{
    const ChangedFiles changed(repository, index);
    if (changed.files().empty())
    {
        return {};
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
    return toStage;
}

} // namespace vclink::git
