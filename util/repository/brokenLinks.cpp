// SPDX-License-Identifier: MIT
#include "util/repository/brokenLinks.hpp"

#include <algorithm>
#include <functional>
#include <memory>

#include <dirent.h>
#include <git2/repository.h>
#include <sys/stat.h>

namespace vclink::git
{
namespace
{

/// Receives the path of an entry, and its type as in dirent.
using Visitor = std::function<bool(const std::string &path, unsigned char type)>;

/// Some file systems do not tell.
unsigned char typeOf(const dirent &entry, const std::string &path)
{
    struct stat status = {};
    const bool isUnknown = entry.d_type == DT_UNKNOWN && ::lstat(path.c_str(), &status) == 0;
    return isUnknown ? static_cast<unsigned char>(IFTODT(status.st_mode)) : entry.d_type;
}

/// Visits what is in a folder until the visitor returns false. A folder that cannot be read counts
/// as empty, as for git and libgit2.
/// @return false if the visitor has
bool visitEntries(const std::string &folder, const Visitor &visitor)
{
    // The standard library's iterators end the process if memory runs out.
    const std::unique_ptr<DIR, int (*)(DIR *)> entries(::opendir(folder.c_str()), ::closedir);
    while (const dirent *const entry = entries != nullptr ? ::readdir(entries.get()) : nullptr)
    {
        const std::string name = entry->d_name;
        const std::string path = folder + '/' + name;
        if (name != "." && name != ".." && !visitor(path, typeOf(*entry, path)))
        {
            return false;
        }
    }
    return true;
}

/// Follows links as libgit2 does. A circle of them ends in a link with too many levels.
bool hasBrokenLink(const std::string &folder)
{
    return !visitEntries(folder,
                         [](const std::string &path, unsigned char type)
                         {
                             struct stat status = {};
                             const bool isLink = type == DT_LNK;
                             if (isLink && ::stat(path.c_str(), &status) != 0)
                             {
                                 return false;
                             }
                             const bool isFolder = type == DT_DIR || S_ISDIR(status.st_mode);
                             return !isFolder || !hasBrokenLink(path);
                         });
}

void collectFiles(const std::string &folder, std::vector<std::string> &files)
{
    visitEntries(folder,
                 [&files](const std::string &path, unsigned char type)
                 {
                     if (type == DT_DIR)
                     {
                         collectFiles(path, files);
                     }
                     else
                     {
                         files.push_back(path);
                     }
                     return true;
                 });
}

} // namespace

std::vector<std::string> findFilesBesideBrokenLink(git_repository *repository,
                                                   const std::string &folder)
{
    const std::string shared = git_repository_commondir(repository);
    std::vector<std::string> files;
    if (hasBrokenLink(shared + "refs"))
    {
        collectFiles(shared + folder, files);
    }
    for (std::string &file : files)
    {
        file.erase(0, shared.size());
    }
    std::sort(files.begin(), files.end());
    return files;
}

} // namespace vclink::git
