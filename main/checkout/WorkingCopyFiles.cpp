// SPDX-License-Identifier: MIT
// WorkingCopy: what is in single files, and whether they are ignored.
#include "main/checkout/WorkingCopy.hpp"

#include <cstring>

#include <fcntl.h>
#include <git2/ignore.h>
#include <git2/odb.h>
#include <git2/repository.h>
#include <sys/stat.h>
#include <unistd.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/checkout/negatedPatterns.hpp"
#include "util/repository/attributes.hpp"
#include "util/repository/objectIds.hpp"

namespace vclink::git
{
namespace
{

constexpr const char *withoutFilters = "";

} // namespace

bool WorkingCopy::isReadable(const std::string &name)
{
    return ::faccessat(AT_FDCWD, pathOf(name).c_str(), R_OK, AT_EACCESS) == 0;
}

bool WorkingCopy::isIgnored(const std::string &name) const
{
    return isIgnoredByLibGit2(name) && !mayBeNegated(repository_, index(), root_, name);
}

bool WorkingCopy::isFalselyIgnored(const std::string &name) const
{
    return isIgnoredByLibGit2(name) && mayBeNegated(repository_, index(), root_, name);
}

bool WorkingCopy::isIgnoredByLibGit2(const std::string &name) const
{
    int ignored = 0;
    check(git_ignore_path_is_ignored, &ignored, repository_, name.c_str());
    return ignored != 0;
}

bool WorkingCopy::isConvertedByGit(const std::string &name) const
{
    const auto has = [&](const char *attribute)
    {
        const char *const value = readAttribute(repository_, name, attribute);
        return git_attr_value(value) == GIT_ATTR_VALUE_STRING && std::strcmp(value, "ident") != 0;
    };
    return has("filter") || has("working-tree-encoding");
}

bool WorkingCopy::isEdited(const git_index_entry &entry)
{
    const std::string name = entry.path;
    if (!wayTo(name).blocker.empty())
    {
        return true;
    }
    const Standing standing = at(name);
    if (standing == Standing::File || standing == Standing::Link)
    {
        const git_oid id = idOf(name, standing);
        return S_ISLNK(entry.mode) != (standing == Standing::Link) || !isSameId(id, entry.id);
    }
    return standing == Standing::Special || (standing == Standing::Folder && holdsFiles(name));
}

bool WorkingCopy::isEditHiddenByConversion(const git_index_entry &entry,
                                           const git_tree_entry *after) const
{
    const std::string name = entry.path;
    const git_oid id = idOfFile(name, name);
    const auto isHiddenTarget = [&]
    {
        return after != nullptr && isSameId(id, *git_tree_entry_id(after)) &&
               !isSameId(id, idOfFile(name, withoutFilters));
    };
    return isSameId(id, entry.id) || isHiddenTarget();
}

/// Returns the id of the file as git would store it.
git_oid WorkingCopy::idOf(const std::string &name, Standing standing) const
{
    if (standing != Standing::Link)
    {
        return idOfFile(name, name);
    }
    git_oid id{};
    const std::string target = readLink(root_ + name);
    check(git_odb_hash, &id, target.data(), target.size(), GIT_OBJECT_BLOB);
    return id;
}

git_oid WorkingCopy::idOfFile(const std::string &name, const std::string &nameForFilters) const
{
    git_oid id{};
    check(git_repository_hashfile, &id, repository_, (root_ + name).c_str(), GIT_OBJECT_BLOB,
          nameForFilters.c_str());
    return id;
}

} // namespace vclink::git
