// SPDX-License-Identifier: MIT
#include "main/files/foldersInIndex.hpp"

#include <algorithm>
#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

#include <git2/index.h>

#include "error/errorUtil/GitResult.hpp"
#include "util/path/PathspecArray.hpp"

namespace vclink::git
{
namespace
{

bool isBelow(std::string_view path, std::string_view file)
{
    return path.size() > file.size() && path[file.size()] == '/' &&
           path.compare(0, file.size(), file) == 0;
}

/// Whether a pattern may mean a file without what is below its name.
bool mayMeanFileOnly(const PathspecArray &pathspec)
{
    const git_strarray &patterns = pathspec.array();
    return std::any_of(patterns.strings, patterns.strings + patterns.count,
                       [](std::string_view pattern)
                       { return pattern.find_first_of("*?[") != std::string_view::npos; });
}

/// In the order of the index, "a-1" may be between "a" and "a/1".
std::vector<std::string> findBelowFiles(git_index *index)
{
    std::vector<std::string> found;
    std::vector<std::string_view> files;
    const std::size_t count = git_index_entrycount(index);
    for (std::size_t i = 0; i < count; ++i)
    {
        const git_index_entry *const entry = git_index_get_byindex(index, i);
        if (GIT_INDEX_ENTRY_STAGE(entry) != GIT_INDEX_STAGE_NORMAL)
        {
            continue;
        }
        const std::string_view path = entry->path;
        while (!files.empty() && path.compare(0, files.back().size(), files.back()) != 0)
        {
            files.pop_back();
        }
        const bool isBelowFile =
            std::any_of(files.begin(), files.end(),
                        [path](std::string_view file) { return isBelow(path, file); });
        if (isBelowFile)
        {
            found.emplace_back(path);
        }
        else
        {
            files.push_back(path);
        }
    }
    return found;
}

} // namespace

bool takeOutBelowFiles(git_index *index, const PathspecArray &pathspec)
{
    if (!mayMeanFileOnly(pathspec))
    {
        return false;
    }
    const std::vector<std::string> paths = findBelowFiles(index);
    for (const std::string &path : paths)
    {
        check(git_index_remove, index, path.c_str(), GIT_INDEX_STAGE_NORMAL);
    }
    return !paths.empty();
}

bool hasFilesBelowFiles(git_index *index)
{
    return !findBelowFiles(index).empty();
}

} // namespace vclink::git
