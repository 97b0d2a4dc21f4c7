// SPDX-License-Identifier: MIT
#include "util/repository/objectFolders.hpp"

#include <algorithm>
#include <cstddef>

#include <git2/repository.h>
#include <unistd.h>

#include "util/repository/linesOf.hpp"

namespace vclink::git
{
namespace
{

/// Returns the folders from which a folder of objects borrows.
std::vector<std::string> alternatesOf(const std::string &objects)
{
    std::vector<std::string> folders;
    const std::string list = objects + "/info/alternates";
    // As libgit2, which fails if the list is there and cannot be read.
    if (::access(list.c_str(), F_OK) != 0)
    {
        return folders;
    }
    for (const std::string &line : linesOf(list))
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
