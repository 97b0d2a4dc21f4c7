// SPDX-License-Identifier: MIT
// WorkingCopy: what is in single files, and whether they are ignored.
#include "main/checkout/WorkingCopy.hpp"

#include <fcntl.h>
#include <git2/config.h>
#include <git2/errors.h>
#include <git2/ignore.h>
#include <git2/odb.h>
#include <git2/repository.h>
#include <strings.h>
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

/// Returns the text of an attribute's value, empty for an attribute without one.
std::string textOf(const char *value)
{
    return git_attr_value(value) == GIT_ATTR_VALUE_STRING ? value : "";
}

/// As git compares names of encodings.
bool isUtf8(const std::string &encoding)
{
    return ::strcasecmp(encoding.c_str(), "UTF-8") == 0 ||
           ::strcasecmp(encoding.c_str(), "UTF8") == 0;
}

bool hasText(git_config *config, const std::string &setting)
{
    const char *value = nullptr;
    const GitResult<void> found = call(git_config_get_string, &value, config, setting.c_str());
    if (found.has_error() && found.error().getCode() == GIT_ENOTFOUND)
    {
        return false;
    }
    check(found);
    return *value != '\0';
}

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

bool WorkingCopy::isConvertedByGit(const std::string &name)
{
    const std::string encoding = textOf(readAttribute(repository_, name, "working-tree-encoding"));
    if (!encoding.empty() && !isUtf8(encoding))
    {
        return true;
    }
    const std::string filter = textOf(readAttribute(repository_, name, "filter"));
    return !filter.empty() && runsFilter(filter);
}

/// Returns true if git runs a command to store the files of a filter. Otherwise, it stores what
/// they hold.
bool WorkingCopy::runsFilter(const std::string &filter)
{
    const auto known = filters_.find(filter);
    if (known != filters_.end())
    {
        return known->second;
    }
    const OwnedHandle<git_config> config =
        acquire<git_config>(git_repository_config_snapshot, repository_).value();
    const std::string section = "filter." + filter;
    const bool runs =
        hasText(config.get(), section + ".clean") || hasText(config.get(), section + ".process");
    return filters_.emplace(filter, runs).first->second;
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

bool WorkingCopy::isOfNeither(const TreeChange &change)
{
    const git_oid id = idOf(change.path, at(change.path));
    const auto isContentOf = [&id](const git_tree_entry *side)
    { return side != nullptr && isSameId(id, *git_tree_entry_id(side)); };
    return !isContentOf(change.before) && !isContentOf(change.after);
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
