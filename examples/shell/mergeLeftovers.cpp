// SPDX-License-Identifier: MIT
#include "mergeLeftovers.hpp"

#include <filesystem>
#include <memory>
#include <string>
#include <system_error>

#include "failures.hpp"
#include "fl/i18n/convert.hpp"
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

FileStateMap findRefused(CMAdapter &adapter, const FileStateMap &conflicts, const MergeNotes &notes)
{
    FileStateMap refused;
    for (const auto &[driver, count] : notes.refusals)
    {
        FileStateMap files = withAttribute(adapter, conflicts, "merge=" + driver);
        if (files.empty())
        {
            // The driver of files without the attribute, by the setting merge.default.
            files = withAttribute(adapter, conflicts, "!merge");
        }
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
        complain(
            say("These files have another name now, because something else has theirs:%1%\nThe "
                "merge leaves them out: move what you want to keep to its place, and add it.",
                listNames(files)));
    }
}

} // namespace vclink::shell
