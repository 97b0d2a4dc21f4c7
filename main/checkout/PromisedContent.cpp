// SPDX-License-Identifier: MIT
#include "main/checkout/PromisedContent.hpp"

#include <string>
#include <string_view>

#include <git2/odb.h>
#include <git2/repository.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/checkout/standing.hpp"

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

bool isPartialClone(git_repository *repository)
{
    bool isMarked = false;
    visitFolder(git_repository_commondir(repository) + std::string("objects/pack"),
                [&isMarked](const std::string &name)
                {
                    isMarked = isPromisorMark(name);
                    return !isMarked;
                });
    return isMarked;
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
