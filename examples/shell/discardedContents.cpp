// SPDX-License-Identifier: MIT
#include "discardedContents.hpp"

#include <algorithm>
#include <cerrno>
#include <cstddef>
#include <filesystem>
#include <iterator>
#include <map>
#include <set>
#include <system_error>

#include <fcntl.h>
#include <unistd.h>

#include "Session.hpp"
#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "indexEntries.hpp"
#include "names.hpp"
#include "storedObjects.hpp"
#include "texts.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

namespace fs = std::filesystem;

/// What a revert overwrites or deletes on the disk.
struct OnDisk
{
    /// files, links, and folders that are in the place of a file, each relative to the root
    std::set<std::string> names;
    /// those in whose place a folder comes back
    std::set<std::string> placesOfFolders;
    /// what there can be no copy of, and why
    std::map<std::string, std::string> obstacles;
};

void collectFile(const fs::path &root, const fs::path &name, OnDisk &found)
{
    const fs::path path = root / name;
    std::error_code error;
    const fs::file_status status = fs::symlink_status(path, error);
    if (fs::is_regular_file(status) && ::faccessat(AT_FDCWD, path.c_str(), R_OK, AT_EACCESS) != 0)
    {
        found.obstacles.emplace(name.string(), std::generic_category().message(errno));
    }
    else if (fs::is_regular_file(status) || fs::is_symlink(status))
    {
        found.names.insert(name.string());
    }
}

/// A folder that is in the place of a file.
void collectFolder(const fs::path &root, const std::string &name, OnDisk &found)
{
    std::error_code error;
    const std::size_t before = found.names.size();
    for (fs::recursive_directory_iterator entry(root / name, error), end; !error && entry != end;
         entry.increment(error))
    {
        if (entry->path().filename() == ".git")
        {
            found.obstacles.emplace(name, say("a repository is in its place"));
            return;
        }
        collectFile(root, entry->path().lexically_relative(root), found);
    }
    if (error)
    {
        found.obstacles.emplace(name, error.message());
    }
    if (found.names.size() != before)
    {
        found.names.insert(name);
    }
}

/// Adds what is in the place of a file: the file, a file or link where it has a folder, or all
/// files of a folder that has its name.
void collectInPlace(const fs::path &root, const std::string &name, OnDisk &found)
{
    fs::path place;
    for (const fs::path &element : fs::path(name))
    {
        place /= element;
        std::error_code error;
        const fs::file_status status = fs::symlink_status(root / place, error);
        if (fs::status_known(status) && !fs::is_directory(status))
        {
            if (fs::exists(status) && place != name)
            {
                found.placesOfFolders.insert(place.string());
            }
            collectFile(root, place, found);
            return;
        }
        if (!fs::status_known(status))
        {
            found.obstacles.emplace(name, error.message());
            return;
        }
    }
    collectFolder(root, name, found);
}

/// What the index holds of what is reverted.
class Index
{
  public:
    /// @throws StoreFailure
    Index(const upath &root, const std::vector<NamedPath> &paths) : root_(nativePath(root))
    {
        for (const NamedPath &named : paths)
        {
            if (liesIn(named.path.string(), root.string()))
            {
                reverted_.push_back(fl::i18n::ustring_to_utf8(relativeName(named.path, root)));
            }
        }
        auto changes = readStagedChanges(root_);
        auto entries = readIndex(root_);
        if (!changes || !entries)
        {
            throw StoreFailure(say("git can't read the index, or is not installed"));
        }
        std::copy_if(changes->begin(), changes->end(), std::back_inserter(changes_),
                     [this](const StagedChange &change) { return isReverted(change.name); });
        entries_ = std::move(*entries);
        findSubmodules();
    }

    const std::vector<StagedChange> &changes() const noexcept
    {
        return changes_;
    }
    /// Whether this is a submodule, in HEAD if HEAD and the index differ. Its folder stays as it
    /// is.
    bool isSubmodule(const std::string &name) const
    {
        return submodules_.count(name) != 0;
    }
    /// Changed files without a changed state, because Git was told not to look at them.
    std::vector<StagedChange> overlookedChanges() const
    {
        std::vector<StagedChange> files;
        for (const IndexEntry &entry : entries_)
        {
            if (entry.isOverlooked() && isReverted(entry.name) && !isSubmodule(entry.name))
            {
                files.push_back({entry.name, entry.mode, entry.mode, entry.id, false});
            }
        }
        return selectOthersThanOnDisk(root_, files, Filters::Ignored);
    }

  private:
    bool isReverted(const std::string &name) const
    {
        return std::any_of(reverted_.begin(), reverted_.end(),
                           [&name](const std::string &path) {
                               return path.empty() || name == path ||
                                      name.compare(0, path.size() + 1, path + '/') == 0;
                           });
    }
    void findSubmodules()
    {
        for (const IndexEntry &entry : entries_)
        {
            if (entry.mode == submoduleMode)
            {
                submodules_.insert(entry.name);
            }
        }
        for (const StagedChange &change : changes_)
        {
            submodules_.erase(change.name);
            if (change.modeInHead == submoduleMode)
            {
                submodules_.insert(change.name);
            }
        }
    }

    fs::path root_;
    std::vector<std::string> reverted_;
    std::vector<StagedChange> changes_;
    std::vector<IndexEntry> entries_;
    std::set<std::string> submodules_;
};

OnDisk collect(const fs::path &root, const std::set<std::string> &names, const Index &index)
{
    OnDisk found;
    for (const std::string &name : names)
    {
        std::error_code ignored;
        if (!index.isSubmodule(name) || !fs::is_directory(root / name, ignored))
        {
            collectInPlace(root, name, found);
        }
    }
    return found;
}

/// What is on the disk under the names that HEAD has: what was only added stays there.
std::set<std::string> namesInHead(const Index &index, const upath &root,
                                  const FileStateMap &changed)
{
    std::set<std::string> names;
    for (const auto &[path, state] : changed)
    {
        names.insert(fl::i18n::ustring_to_utf8(relativeName(path, root)));
    }
    for (const StagedChange &change : index.changes())
    {
        names.insert(change.name);
        if (change.isAdded())
        {
            names.erase(change.name);
        }
    }
    return names;
}

/// @throws ShellFailure that names each
void refuseObstacles(const fs::path &root, const std::map<std::string, std::string> &obstacles)
{
    std::string text;
    for (const auto &[name, reason] : obstacles)
    {
        text += "\n  " + showPath(makePath(root / name)) + ": " + reason;
    }
    if (!text.empty())
    {
        throw ShellFailure(
            say("Nothing was reverted, because these can't be stored first:%1%\nMove them out of "
                "the way, or discard them without a copy with --forget.",
                text));
    }
}

/// "" for the folder that the person is in, otherwise "-C FOLDER ".
std::string optionForFolder(const fs::path &root, const fs::path &start)
{
    const upath folder = makePath(start);
    const bool isInside = liesIn(folder.string(), makePath(root).string());
    const fs::path way =
        isInside ? nativePath(upath(wayTo(makePath(root), folder.string()))) : root;
    return way == "." ? std::string() : "-C " + quoteForShell(way.string()) + ' ';
}

std::string shorten(const std::string &id)
{
    return id.substr(0, 12);
}

WayBack keep(Session &session, const std::vector<NamedPath> &paths, const FileStateMap &changed)
{
    const upath &rootPath = session.adapter().getRootFolder();
    const fs::path root = nativePath(rootPath);
    const Index index(rootPath, paths);
    const OnDisk onDisk = collect(root, namesInHead(index, rootPath, changed), index);
    refuseObstacles(root, onDisk.obstacles);
    const std::string folder = optionForFolder(root, session.startFolder());
    WayBack wayBack;
    if (!onDisk.names.empty())
    {
        const std::string archive = storeArchive(root, {onDisk.names.begin(), onDisk.names.end()});
        // tar could remove them, with all that is put into them until then.
        for (const std::string &name : onDisk.placesOfFolders)
        {
            wayBack.files += say("Before you restore, move the folder '%1%' out of the way.\n",
                                 showPath(makePath(root / name)));
        }
        wayBack.files +=
            say("To restore what was discarded: %1%",
                fill("git %1%cat-file blob %2% | tar %1%-xp", {folder, shorten(archive)}));
    }
    std::vector<StagedChange> staged = index.changes();
    staged.erase(std::remove_if(staged.begin(), staged.end(),
                                [](const StagedChange &change)
                                { return change.isDeleted() || change.isIntended; }),
                 staged.end());
    if (!selectOthersThanOnDisk(root, staged, Filters::Applied).empty())
    {
        wayBack.staged = say("To restore what was staged: %1%",
                             fill("git %1%restore --overlay --staged --source=%2% :/",
                                  {folder, shorten(storeTree(root, staged))}));
    }
    return wayBack;
}

} // namespace

void addOverlooked(CMAdapter &adapter, std::vector<NamedPath> &paths)
try
{
    const upath &root = adapter.getRootFolder();
    for (const StagedChange &change : Index(root, paths).overlookedChanges())
    {
        const upath path = makePath(nativePath(root) / change.name);
        for (NamedPath &named : paths)
        {
            if (liesIn(path.string(), named.path.string()))
            {
                named.states.insert_or_assign(path, FileState(FileState::Modified));
            }
        }
    }
}
catch (const StoreFailure &)
{
    // Then nothing can be kept either, which keepContents() reports.
}

WayBack keepContents(Session &session, const std::vector<NamedPath> &paths,
                     const FileStateMap &changed)
{
    try
    {
        return keep(session, paths, changed);
    }
    catch (const StoreFailure &failure)
    {
        throw ShellFailure(say("Nothing was reverted, because the changes can't be stored first: "
                               "%1%.\nTo discard them without a copy, use --forget.",
                               failure.what()));
    }
}

} // namespace vclink::shell
