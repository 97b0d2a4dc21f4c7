// SPDX-License-Identifier: MIT
#include "main/files/otherCase.hpp"

#include <algorithm>
#include <cstddef>
#include <functional>
#include <string>

#include <git2/errors.h>
#include <git2/index.h>
#include <strings.h>

#include "error/errorUtil/raiseGitError.hpp"
#include "main/files/ListedFiles.hpp"

namespace vclink::git
{
namespace
{

bool hasChanged(const ChangedFiles &changed, const char *path)
{
    return std::any_of(changed.files().begin(), changed.files().end(),
                       [path](const ChangedFile &file) { return file.path == path; });
}

/// Refuses a file of which this is true, if another one has its name in another case.
/// @param advice what to do instead
void refuseIf(git_index *index, const std::function<bool(const char *)> &isConcerned,
              const char *advice)
{
    // Such an index is sorted without regard to case.
    const std::size_t count = git_index_entrycount(index);
    for (std::size_t i = 1; i < count; ++i)
    {
        const std::string one = git_index_get_byindex(index, i - 1)->path;
        const char *const other = git_index_get_byindex(index, i)->path;
        if (one != other && ::strcasecmp(one.c_str(), other) == 0 &&
            (isConcerned(one.c_str()) || isConcerned(other)))
        {
            raiseGitError(GIT_ERROR, GIT_ERROR_INDEX,
                          "the names '" + one + "' and '" + other +
                              "' differ only in case, and 'core.ignorecase' is set: " + advice);
        }
    }
}

bool ignoresCase(git_index *index)
{
    return (git_index_caps(index) & GIT_INDEX_CAPABILITY_IGNORE_CASE) != 0;
}

} // namespace

void refuseOtherCase(git_index *index, const ChangedFiles &changed)
{
    if (!changed.files().empty() && ignoresCase(index))
    {
        refuseIf(
            index, [&changed](const char *path) { return hasChanged(changed, path); },
            "commit with 'git commit', or rename one of them");
    }
}

void refuseOtherCase(git_index *index, const git_strarray &listed)
{
    if (ignoresCase(index))
    {
        const ListedFiles files(index, listed);
        refuseIf(
            index, [&files](const char *path) { return files.contain(path); },
            "use git for them, or set it to false if the file system distinguishes case");
    }
}

} // namespace vclink::git
