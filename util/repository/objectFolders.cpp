// SPDX-License-Identifier: MIT
#include "util/repository/objectFolders.hpp"

#include <algorithm>
#include <cstddef>

#include <git2/repository.h>

#include "util/repository/linesOf.hpp"

namespace vclink::git
{
namespace
{

/// Returns the folders that a folder of objects names.
std::vector<std::string> alternatesOf(const std::string &objects)
{
    std::vector<std::string> folders;
    for (const std::string &line : linesOf(objects + "/info/alternates"))
    {
        if (!line.empty() && line.front() != '#')
        {
            folders.push_back(line.front() == '/' ? line : objects + '/' + line);
        }
    }
    return folders;
}

} // namespace

std::vector<std::string> findObjectFolders(git_repository *repository)
{
    // As in git and libgit2.
    constexpr int maximalDepth = 5;
    std::vector<std::string> folders{git_repository_commondir(repository) + std::string("objects")};
    std::size_t next = 0;
    for (int depth = 0; depth <= maximalDepth; ++depth)
    {
        for (const std::size_t end = folders.size(); next < end; ++next)
        {
            for (const std::string &folder : alternatesOf(folders[next]))
            {
                if (std::find(folders.begin(), folders.end(), folder) == folders.end())
                {
                    folders.push_back(folder);
                }
            }
        }
    }
    return folders;
}

} // namespace vclink::git
