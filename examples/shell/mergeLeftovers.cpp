// SPDX-License-Identifier: MIT
#include "mergeLeftovers.hpp"

#include <memory>
#include <string>

#include "fl/i18n/convert.hpp"
#include "namedPaths.hpp"
#include "names.hpp"
#include "revisions.hpp"
#include "states.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitAttributes.hpp"

namespace vclink::shell
{
namespace
{

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

FileStateMap findSetAside(const FileStateMap &states)
{
    FileStateMap found;
    for (const auto &entry : states)
    {
        const ustring &name = entry.first.string();
        const std::size_t mark = name.rfind(u'~');
        const bool isNew = entry.second.getState() == FileState::Unversioned;
        if (isNew && mark != ustring::npos && isSide(name.substr(mark + 1)) &&
            isTaken(name.substr(0, mark), states))
        {
            found.insert(found.end(), entry);
        }
    }
    return found;
}

} // namespace vclink::shell
