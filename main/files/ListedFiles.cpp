// SPDX-License-Identifier: MIT
#include "main/files/ListedFiles.hpp"

#include <git2/index.h>

#include "error/errorUtil/GitResult.hpp"

namespace vclink::git
{

ListedFiles::ListedFiles(git_index *index, const git_strarray &listed)
{
    git_pathspec *raw = nullptr;
    const GitResult<void> made = call(git_pathspec_new, &raw, &listed);
    pathspec_.reset(raw);
    check(made);
    const bool isCaseIgnored = (git_index_caps(index) & GIT_INDEX_CAPABILITY_IGNORE_CASE) != 0;
    flags_ = isCaseIgnored ? GIT_PATHSPEC_IGNORE_CASE : GIT_PATHSPEC_DEFAULT;
}

bool ListedFiles::contain(const std::string &path) const
{
    return git_pathspec_matches_path(pathspec_.get(), flags_, path.c_str()) != 0;
}

} // namespace vclink::git
