// SPDX-License-Identifier: MIT
#include "main/checkout/NewAttributes.hpp"

#include <cerrno>
#include <utility>

#include <fcntl.h>
#include <git2/attr.h>
#include <git2/index.h>
#include <git2/repository.h>
#include <unistd.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/raiseSystemError.hpp"
#include "main/checkout/standing.hpp"
#include "util/repository/objectIds.hpp"
#include "util/repository/repository.hpp"
#include "util/scope/FileDescriptor.hpp"

namespace vclink::git
{
namespace
{

/// Empties a file that cannot be removed from its folder.
void removeOrEmpty(const std::string &path)
{
    if (standingAt(path) != Standing::File || ::unlink(path.c_str()) == 0)
    {
        return;
    }
    const FileDescriptor file(
        ::open(path.c_str(), O_WRONLY | O_TRUNC | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC));
    if (!file)
    {
        raiseSystemError(errno, "could not replace '" + path + "'");
    }
}

} // namespace

void setAttributes(git_index *index, const char *name, const git_diff_file &file)
{
    const git_index_entry *const present = git_index_get_bypath(index, name, 0);
    if (present == nullptr || !isSameId(present->id, file.id))
    {
        git_index_entry entry{};
        entry.path = name;
        entry.mode = file.mode;
        entry.id = file.id;
        check(git_index_add, index, &entry);
    }
}

void NewAttributes::apply(git_repository *repository)
{
    isPending_ = false;
    git_attr_cache_flush(repository);
    const std::vector<Noted> noted = std::exchange(noted_, {});
    if (noted.empty())
    {
        return;
    }
    const std::string root = git_repository_workdir(repository);
    const OwnedHandle<git_index> index = getRepositoryIndex(repository);
    for (const Noted &attributes : noted)
    {
        removeOrEmpty(root + attributes.name);
        setAttributes(index.get(), attributes.name.c_str(), attributes.file);
    }
}

void NewAttributes::settle(git_repository *repository) const
{
    if (canConflict_)
    {
        git_attr_cache_flush(repository);
    }
}

} // namespace vclink::git
