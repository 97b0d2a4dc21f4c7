// SPDX-License-Identifier: MIT
#include "util/repository/brokenLinks.hpp"

#include <algorithm>
#include <functional>
#include <memory>
#include <set>
#include <utility>

#include <dirent.h>
#include <git2/errors.h>
#include <git2/repository.h>
#include <sys/stat.h>
#include <sys/types.h>

#include "error/errorUtil/raiseGitError.hpp"

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

/// Follows links as libgit2 does, but never into a folder that it is in.
class LinkSearch
{
  public:
    /// @param type as in dirent
    /// @return false if the search has ended
    bool look(const std::string &path, unsigned char type)
    {
        struct stat status = {};
        const bool isLink = type == DT_LNK;
        if ((isLink || type == DT_DIR) && ::stat(path.c_str(), &status) != 0)
        {
            hasBroken_ = hasBroken_ || isLink;
            return true;
        }
        return !S_ISDIR(status.st_mode) || enter(path, {status.st_dev, status.st_ino});
    }

    /// A circle of links ends in a link with too many levels.
    bool hasBroken() const noexcept
    {
        return hasBroken_ || !circled_.empty();
    }

    /// Returns a link that ends a circle, which shares a folder with another circle: each turn has
    /// both to choose from. Empty if there is none.
    const std::string &crossing() const noexcept
    {
        return crossing_;
    }

  private:
    using FolderId = std::pair<dev_t, ino_t>;

    bool enter(const std::string &folder, const FolderId &id)
    {
        const auto first = std::find(way_.begin(), way_.end(), id);
        if (first != way_.end())
        {
            return noteCircle(first, folder);
        }
        way_.push_back(id);
        const bool goesOn = visitEntries(folder, [this](const std::string &path, unsigned char type)
                                         { return look(path, type); });
        way_.pop_back();
        return goesOn;
    }

    bool noteCircle(std::vector<FolderId>::const_iterator first, const std::string &link)
    {
        const bool isAlone = std::all_of(
            first, way_.cend(), [this](const FolderId &id) { return circled_.insert(id).second; });
        if (!isAlone)
        {
            crossing_ = link;
        }
        return isAlone;
    }

    /// The folders that the search is in.
    std::vector<FolderId> way_;
    /// The folders that are in a circle.
    std::set<FolderId> circled_;
    bool hasBroken_ = false;
    std::string crossing_;
};

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

bool hasBrokenReferenceLink(git_repository *repository)
{
    const std::string shared = git_repository_commondir(repository);
    LinkSearch search;
    search.look(shared + "refs", DT_DIR);
    const std::string &link = search.crossing();
    if (!link.empty())
    {
        raiseGitError(GIT_ERROR, GIT_ERROR_REFERENCE,
                      "'" + link.substr(shared.size()) +
                          "' and another symbolic link lead to folders that contain them, so that "
                          "the list of references has no end: remove them");
    }
    return search.hasBroken();
}

std::vector<std::string> findReferenceFiles(git_repository *repository, const std::string &folder)
{
    const std::string shared = git_repository_commondir(repository);
    std::vector<std::string> files;
    collectFiles(shared + folder, files);
    for (std::string &file : files)
    {
        file.erase(0, shared.size());
    }
    std::sort(files.begin(), files.end());
    return files;
}

} // namespace vclink::git
