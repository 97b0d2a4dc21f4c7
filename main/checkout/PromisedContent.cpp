// SPDX-License-Identifier: MIT
#include "main/checkout/PromisedContent.hpp"

#include <algorithm>
#include <string>
#include <string_view>
#include <vector>

#include <git2/odb.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/checkout/standing.hpp"
#include "util/repository/objectFolders.hpp"

namespace vclink::git
{
namespace
{

/// git marks the packs that it has fetched for a partial clone.
bool isPromisorMark(std::string_view name)
{
    constexpr std::string_view suffix = ".promisor";
    return name.size() > suffix.size() &&
           name.compare(name.size() - suffix.size(), suffix.size(), suffix) == 0;
}

bool hasPromisorPack(const std::string &objects)
{
    bool isMarked = false;
    visitFolder(objects + "/pack",
                [&isMarked](const std::string &name)
                {
                    isMarked = isPromisorMark(name);
                    return !isMarked;
                });
    return isMarked;
}

/// The packs of a partial clone can all be in the repository from which it borrows.
bool isPartialClone(git_repository *repository)
{
    const std::vector<std::string> folders = findObjectFolders(repository);
    return std::any_of(folders.begin(), folders.end(), hasPromisorPack);
}

} // namespace

PromisedContent::PromisedContent(git_repository *repository)
{
    if (isPartialClone(repository))
    {
        database_ = acquire<git_odb>(git_repository_odb, repository).value();
    }
}

Finding PromisedContent::look(std::string_view path, const git_oid &id) const
{
    if (git_odb_exists(database_.get(), &id) != 0)
    {
        return {};
    }
    const std::string name(path);
    return Obstacle{name, "the content of '" + name +
                              "' is not in this partial clone, and only git fetches it: use git "
                              "for this"};
}

} // namespace vclink::git
