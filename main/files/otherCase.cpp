// SPDX-License-Identifier: MIT
#include "main/files/otherCase.hpp"

#include <algorithm>
#include <cstddef>
#include <string>

#include <git2/errors.h>
#include <git2/index.h>
#include <strings.h>

#include "error/errorUtil/raiseGitError.hpp"

namespace vclink::git
{
namespace
{

bool hasChanged(const ChangedFiles &changed, const char *path)
{
    return std::any_of(changed.files().begin(), changed.files().end(),
                       [path](const ChangedFile &file) { return file.path == path; });
}

} // namespace

void refuseOtherCase(git_index *index, const ChangedFiles &changed)
{
    if (changed.files().empty() || (git_index_caps(index) & GIT_INDEX_CAPABILITY_IGNORE_CASE) == 0)
    {
        return;
    }
    // Such an index is sorted without regard to case.
    const std::size_t count = git_index_entrycount(index);
    for (std::size_t i = 1; i < count; ++i)
    {
        const std::string one = git_index_get_byindex(index, i - 1)->path;
        const char *const other = git_index_get_byindex(index, i)->path;
        if (one != other && ::strcasecmp(one.c_str(), other) == 0 &&
            (hasChanged(changed, one.c_str()) || hasChanged(changed, other)))
        {
            raiseGitError(GIT_ERROR, GIT_ERROR_INDEX,
                          "the names '" + one + "' and '" + other +
                              "' differ only in case, and 'core.ignorecase' is set: commit with "
                              "'git commit', or rename one of them");
        }
    }
}

} // namespace vclink::git
