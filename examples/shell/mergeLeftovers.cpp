// SPDX-License-Identifier: MIT
#include "mergeLeftovers.hpp"

#include <filesystem>
#include <memory>
#include <set>
#include <string>
#include <system_error>
#include <vector>

#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "gitProgram.hpp"
#include "namedPaths.hpp"
#include "names.hpp"
#include "renames.hpp"
#include "revisions.hpp"
#include "states.hpp"
#include "texts.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitAttributes.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

namespace fs = std::filesystem;

std::string nameOf(const upath &file, const upath &root)
{
    return fl::i18n::ustring_to_utf8(relativeName(file, root));
}

/// The files whose attribute "merge" is written so.
FileStateMap withAttribute(CMAdapter &adapter, const FileStateMap &files, const std::string &text)
{
    const auto attributes = git::GitAttributes::create(adapter);
    FileStateMap found;
    for (const auto &entry : files)
    {
        const upath name(relativeName(entry.first, adapter.getRootFolder()));
        const auto attribute = attributes->getAttribute(name, u"merge");
        if (git::serialize(attribute) == text)
        {
            found.insert(found.end(), entry);
        }
    }
    return found;
}

/// The files that both sides have. A command gets no others.
FileStateMap ofBothSides(CMAdapter &adapter, const FileStateMap &files)
{
    const auto manager = git::BranchManager::create(adapter);
    FileStateMap found;
    for (const auto &entry : files)
    {
        const std::string name = nameOf(entry.first, adapter.getRootFolder());
        if (findRevision(*manager, "HEAD:" + name) && findRevision(*manager, "MERGE_HEAD:" + name))
        {
            found.insert(found.end(), entry);
        }
    }
    return found;
}

/// A side as libgit2 writes it behind a name: "HEAD" or an id, and a number if that was taken too.
bool isSide(const ustring &text)
{
    const ustring side = text.substr(0, text.find(u'_'));
    return side == u"HEAD" ||
           (side.size() == 40 && side.find_first_not_of(u"0123456789abcdef") == ustring::npos);
}

/// Whether there is a file of this name, or a folder with files.
bool isTaken(const ustring &name, const FileStateMap &states)
{
    const auto next = states.lower_bound(upath(name));
    return next != states.end() && liesIn(next->first.string(), name);
}

/// Whether the name is that of something else, with a side behind it.
bool isSetAside(const ustring &name, const FileStateMap &states)
{
    const std::size_t mark = name.rfind(u'~');
    return mark != ustring::npos && isSide(name.substr(mark + 1)) &&
           isTaken(name.substr(0, mark), states);
}

std::set<std::string> changedNames(const fs::path &root, const std::string &from,
                                   const std::string &to)
{
    const auto output = runGit(root, {"diff-tree", "-r", "-z", "--name-only", from, to});
    const std::vector<std::string> names = splitAtNul(output.value_or(""));
    return {names.begin(), names.end()};
}

bool isFolder(const fs::directory_entry &entry)
{
    std::error_code ignored;
    return fs::is_directory(entry.symlink_status(ignored));
}

/// What Git keeps, and the folders of other repositories.
bool isForeign(const fs::directory_entry &entry)
{
    return entry.path().filename() == ".git" || (isFolder(entry) && hasGitEntry(entry.path()));
}

} // namespace

FileStateMap withDriver(CMAdapter &adapter, const FileStateMap &files, const std::string &driver)
{
    FileStateMap found = withAttribute(adapter, files, "merge=" + driver);
    // The driver of files without the attribute, by the setting merge.default.
    return found.empty() ? withAttribute(adapter, files, "!merge") : found;
}

FileStateMap findChangedByBoth(CMAdapter &adapter, const std::optional<std::string> &theirs)
{
    FileStateMap found;
    const fs::path root = nativePath(adapter.getRootFolder());
    const auto bases = runGit(root, {"merge-base", "HEAD", theirs.value_or("")});
    if (!bases)
    {
        return found;
    }
    const std::string base = bases->substr(0, bases->find('\n'));
    const std::set<std::string> byThem = changedNames(root, base, *theirs);
    const std::set<std::string> different = changedNames(root, "HEAD", *theirs);
    for (const std::string &name : changedNames(root, base, "HEAD"))
    {
        if (byThem.count(name) != 0 && different.count(name) != 0)
        {
            found.emplace(makePath(root / name), FileState(FileState::Modified));
        }
    }
    return found;
}

FileStateMap findRefused(CMAdapter &adapter, const FileStateMap &conflicts, const MergeNotes &notes)
{
    FileStateMap refused;
    for (const auto &[driver, count] : notes.refusals)
    {
        FileStateMap files = withDriver(adapter, conflicts, driver);
        FileStateMap likely = ofBothSides(adapter, files);
        refused.merge(likely.size() >= count ? likely : files);
    }
    return refused;
}

FileStateMap findSetAside(const upath &root, const FileStateMap &states)
{
    FileStateMap found;
    std::error_code error;
    // From the disk: states leave out what Git ignores.
    fs::recursive_directory_iterator entry(nativePath(root),
                                           fs::directory_options::skip_permission_denied, error);
    for (; !error && entry != fs::recursive_directory_iterator(); entry.increment(error))
    {
        if (isForeign(*entry))
        {
            entry.disable_recursion_pending();
            continue;
        }
        const upath path = makePath(entry->path());
        const auto state = states.find(path);
        const bool isNew =
            state == states.end() || state->second.getState() == FileState::Unversioned;
        if (isNew && isSetAside(path.string(), states) && !isFolder(*entry))
        {
            found.emplace(path, FileState(FileState::Unversioned));
        }
    }
    return found;
}

void tellSetAside(CMAdapter &adapter)
{
    if (git::BranchManager::create(adapter)->getRepositoryState() == "Normal")
    {
        return;
    }
    const FileStateMap states = folderStates(adapter, adapter.getRootFolder());
    const FileStateMap files = findSetAside(adapter.getRootFolder(), states);
    if (!files.empty())
    {
        complain(say(
            "The merge has renamed these files, because something else has their names:%1%\nThey "
            "are not in the merge: move each that you want to keep to its place, and add it.",
            listNames(files)));
    }
}

} // namespace vclink::shell
