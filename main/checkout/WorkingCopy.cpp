// SPDX-License-Identifier: MIT
#include "main/checkout/WorkingCopy.hpp"

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <string_view>
#include <utility>

#include <git2.h>
#include <sys/stat.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/checkout/RemadeFiles.hpp"
#include "main/checkout/gitlinks.hpp"
#include "main/checkout/siblingNames.hpp"
#include "util/repository/repository.hpp"

namespace vclink::git
{
namespace
{

OwnedHandle<git_tree> headTreeOf(git_repository *repository, const git_reference *head)
{
    const OwnedHandle<git_object> object =
        acquire<git_object>(git_reference_peel, head, GIT_OBJECT_TREE).value();
    return lookupTree(repository, git_object_id(object.get()));
}

std::string workdirOf(git_repository *repository)
{
    const char *const workdir = git_repository_workdir(repository);
    return workdir != nullptr ? workdir : "";
}

/// Views, because the compiler inlines their functions: this runs several times for each file.
bool isDirectlyIn(std::string_view folder, std::string_view name)
{
    const std::size_t size = folder.size();
    return name.size() > size && name[size] == '/' && name.substr(0, size) == folder &&
           name.find('/', size + 1) == std::string_view::npos;
}

} // namespace

bool isHidden(const git_index_entry &entry) noexcept
{
    return ((entry.flags & GIT_INDEX_ENTRY_VALID) != 0 ||
            (entry.flags_extended & GIT_INDEX_ENTRY_SKIP_WORKTREE) != 0) &&
           entry.mode != GIT_FILEMODE_COMMIT;
}

WorkingCopy::WorkingCopy(git_repository *repository)
    : repository_(repository), root_(workdirOf(repository)), index_(getRepositoryIndex(repository)),
      hasIndex_(standingAt(git_index_path(index_.get())) != Standing::Nothing), path_(root_)
{
    const OwnedHandle<git_reference> head = lookupHead(repository);
    if (head != nullptr)
    {
        headThen_ = Head(head.get());
        head_ = headTreeOf(repository, head.get());
    }
}

bool WorkingCopy::hasHeadMoved() const
{
    return headThen_.hasMoved(repository_);
}

Standing WorkingCopy::at(const std::string &name)
{
    const std::string &path = pathOf(name);
    isKnown_ = true;
    if (wayTo(name).standing != Standing::Folder)
    {
        status_ = {};
        return Standing::Nothing;
    }
    return standingAt(path, status_);
}

const struct stat &WorkingCopy::statusOf(const std::string &name)
{
    if (!isKnown_ || std::string_view(path_).substr(root_.size()) != name)
    {
        at(name);
    }
    return status_;
}

const std::string &WorkingCopy::pathOf(const std::string &name)
{
    isKnown_ = false;
    path_.replace(root_.size(), std::string::npos, name);
    return path_;
}

bool WorkingCopy::holdsFiles(const std::string &folder) const
{
    return vclink::git::holdsFiles(root_ + folder);
}

bool WorkingCopy::hasSiblingBeforeFolder(const std::string &folder) const
{
    const auto slash = folder.rfind('/');
    const std::size_t start = slash == std::string::npos ? 0 : slash + 1;
    const std::string name = folder.substr(start);
    const std::string parent = root_ + folder.substr(0, start);
    bool isFound = false;
    const bool isRead = visitFolder(parent,
                                    [&](const std::string &sibling)
                                    {
                                        isFound = sortsBetweenFileAndFolder(name, sibling);
                                        return !isFound;
                                    });
    return isFound || !isRead;
}

const WorkingCopy::Way &WorkingCopy::wayTo(const std::string &name, bool isInHead)
{
    // Names come in the order of folders.
    if (wayToFolder_ != nullptr && isDirectlyIn(folder_, name))
    {
        return *wayToFolder_;
    }
    const auto end = name.rfind('/');
    if (end == std::string::npos)
    {
        return wayToRoot_;
    }
    folder_.assign(name, 0, end);
    wayToFolder_ = nullptr;
    wayToFolder_ = &findWay(name, isInHead);
    return *wayToFolder_;
}

const WorkingCopy::Way &WorkingCopy::findWay(const std::string &name, bool isInHead)
{
    const auto known = ways_.find(folder_);
    if (known != ways_.end())
    {
        return known->second;
    }
    const Way *way = &wayToRoot_;
    for (auto next = name.find('/'); next != std::string::npos; next = name.find('/', next + 1))
    {
        const auto [place, isNew] = ways_.try_emplace(name.substr(0, next));
        if (isNew)
        {
            place->second = wayInto(place->first, *way, isInHead);
        }
        way = &place->second;
    }
    return *way;
}

void WorkingCopy::forget()
{
    ways_.clear();
    wayToFolder_ = nullptr;
    entry_ = nullptr;
    missing_.clear();
    examined_.reset();
    isKnown_ = false;
}

WorkingCopy::Way WorkingCopy::wayInto(const std::string &folder, const Way &above,
                                      bool isInHead) const
{
    if (above.standing != Standing::Folder || !above.blocker.empty())
    {
        return above;
    }
    const Standing standing = standingAt(root_ + folder);
    if (standing == Standing::Nothing)
    {
        return {standing, ""};
    }
    const git_object_t type = isInHead ? GIT_OBJECT_TREE : typeInHead(folder);
    const bool isReplaced = type == GIT_OBJECT_BLOB || type == GIT_OBJECT_COMMIT;
    if (standing == Standing::Folder)
    {
        return {standing, isReplaced && holdsFiles(folder) ? folder : ""};
    }
    // An unchanged file or link of HEAD is removed first.
    const bool goesFirst = isReplaced && standing != Standing::Special;
    return goesFirst ? Way{Standing::Nothing, ""} : Way{standing, folder};
}

const std::string &WorkingCopy::unwritableFolderOf(const std::string &name)
{
    const std::size_t size = name.rfind('/') + 1;
    if (examined_ && name.compare(0, size, *examined_) == 0)
    {
        return unwritable_;
    }
    examined_ = name.substr(0, size);
    unwritable_ = unwritableFolderAbove(root_ + name);
    if (!unwritable_.empty())
    {
        unwritable_ = unwritable_.size() > root_.size() ? unwritable_.substr(root_.size()) : "./";
    }
    return unwritable_;
}

void WorkingCopy::readModulesFor(const TreeChange &change) const
{
    if (!isGitlink(change.after))
    {
        return;
    }
    const GitResult<void> found =
        call(git_submodule_lookup, nullptr, repository_, change.path.c_str());
    const int code = found.has_error() ? found.error().getCode() : 0;
    // It need not be in the file.
    if (code != GIT_ENOTFOUND && code != GIT_EEXISTS)
    {
        found.value();
    }
}

const git_index_entry *WorkingCopy::entryOf(const std::string &name)
{
    if (entry_ != nullptr && std::strcmp(entry_->path, name.c_str()) == 0)
    {
        return entry_;
    }
    if (!missing_.empty() && missing_ == name)
    {
        return nullptr;
    }
    entry_ = findEntry(name.c_str());
    if (entry_ == nullptr)
    {
        missing_ = name;
    }
    return entry_;
}

/// Names come in the order of the index, and often one after the other. Otherwise, searches from
/// the last place on in growing steps. libgit2 calculates a hash of each name. It is asked for what
/// is not found, because it may treat upper and lower case as equal.
const git_index_entry *WorkingCopy::findEntry(const char *name)
{
    git_index *const index = index_.get();
    const auto isOfName = [name](const git_index_entry *entry)
    {
        return entry != nullptr && GIT_INDEX_ENTRY_STAGE(entry) == GIT_INDEX_STAGE_NORMAL &&
               std::strcmp(entry->path, name) == 0;
    };
    const git_index_entry *const next = git_index_get_byindex(index, place_);
    if (isOfName(next))
    {
        ++place_;
        return next;
    }
    const auto isBefore = [index, name](std::size_t place)
    { return std::strcmp(git_index_get_byindex(index, place)->path, name) < 0; };
    const std::size_t count = git_index_entrycount(index);
    const bool goesOn = place_ > 0 && place_ <= count && isBefore(place_ - 1);
    std::size_t first = goesOn ? place_ : 0;
    std::size_t last = first;
    for (std::size_t step = 1; last < count && isBefore(last); step *= 2)
    {
        first = last + 1;
        last = std::min(count, last + step);
    }
    while (first < last)
    {
        const std::size_t middle = first + (last - first) / 2;
        const bool isAfter = !isBefore(middle);
        (isAfter ? last : first) = isAfter ? middle : middle + 1;
    }
    const git_index_entry *const entry = git_index_get_byindex(index, first);
    const bool isFound = isOfName(entry);
    place_ = isFound ? first + 1 : first;
    return isFound ? entry : git_index_get_bypath(index, name, GIT_INDEX_STAGE_NORMAL);
}

bool WorkingCopy::hasHidden()
{
    if (!hasHidden_)
    {
        std::size_t place = git_index_entrycount(index_.get());
        while (place > 0 && !isHidden(*git_index_get_byindex(index_.get(), place - 1)))
        {
            --place;
        }
        hasHidden_ = place > 0;
    }
    return *hasHidden_;
}

bool WorkingCopy::hasEntryBelow(const std::string &folder) const
{
    const std::string prefix = folder + '/';
    const GitResult<void> found =
        call(git_index_find_prefix, nullptr, index_.get(), prefix.c_str());
    if (found.has_error() && found.error().getCode() == GIT_ENOTFOUND)
    {
        return false;
    }
    found.value();
    return true;
}

bool WorkingCopy::mustBeRemade(const std::string &name)
{
    return vclink::git::mustBeRemade(pathOf(name));
}

bool WorkingCopy::isInHead(const std::string &name) const
{
    return typeInHead(name) != GIT_OBJECT_INVALID;
}

bool WorkingCopy::isFolderInHead(const std::string &name) const
{
    return typeInHead(name) == GIT_OBJECT_TREE;
}

std::string WorkingCopy::foreignBelow(const std::string &folder) const
{
    std::string foreign;
    const bool isRead =
        visitFolder(root_ + folder,
                    [&](const std::string &entry)
                    {
                        const std::string name = folder + '/' + entry;
                        const bool isFolder = standingAt(root_ + name) == Standing::Folder;
                        const git_object_t type = typeInHead(name);
                        if (isFolder ? type != GIT_OBJECT_TREE : type != GIT_OBJECT_BLOB)
                        {
                            foreign = name;
                        }
                        else if (isFolder)
                        {
                            foreign = foreignBelow(name);
                        }
                        return foreign.empty();
                    });
    return isRead ? foreign : folder;
}

std::string WorkingCopy::stagedBelow(const std::string &folder) const
{
    const std::string prefix = folder + '/';
    const std::size_t count = git_index_entrycount(index_.get());
    for (std::size_t i = 0; i < count; ++i)
    {
        const char *const name = git_index_get_byindex(index_.get(), i)->path;
        if (prefix.compare(0, prefix.size(), name, 0, prefix.size()) == 0 && !isInHead(name))
        {
            return name;
        }
    }
    return {};
}

/// Returns GIT_OBJECT_INVALID if HEAD does not have the name.
git_object_t WorkingCopy::typeInHead(const std::string &name) const
{
    const OwnedTreeEntry entry = findInTree(head_.get(), name);
    return entry != nullptr ? git_tree_entry_type(entry.get()) : GIT_OBJECT_INVALID;
}

} // namespace vclink::git
