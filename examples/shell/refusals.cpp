// SPDX-License-Identifier: MIT
#include "refusals.hpp"

#include <algorithm>
#include <filesystem>
#include <system_error>

#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "links.hpp"
#include "names.hpp"
#include "states.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

namespace fs = std::filesystem;

bool isPattern(const ustring &name)
{
    return name.find_first_of(u"*?[") != ustring::npos;
}

/// One question for the whole is cheaper than one for each file, but may be one without an answer.
FileStateMap statesAfterwards(CMAdapter &adapter, const FileStateMap &files)
{
    FileStateMap states = adapter.getFolderStates(adapter.getRootFolder());
    if (states.empty())
    {
        states = adapter.getFileStates(addressable(files, adapter.getRootFolder()));
    }
    if (states.empty())
    {
        refuseUnknownStates(adapter);
    }
    return states;
}

} // namespace

void refuseUnless(const std::string &refusal, const std::vector<NamedPath> &paths,
                  const Objection &objection)
{
    std::string reasons;
    for (const NamedPath &named : paths)
    {
        const std::string reason = objection(named);
        if (!reason.empty())
        {
            const ustring name = fl::i18n::utf8_to_ustring(named.argument);
            reasons += "\n  " + quoteName(name) + ": " + reason;
        }
    }
    if (!reasons.empty())
    {
        throw ShellFailure(refusal + ':' + reasons);
    }
}

std::string explainAbsence(const upath &root, const NamedPath &named)
{
    const ustring &text = named.path.string();
    const fs::path path = nativePath(named.path);
    if (!liesIn(text, root.string()))
    {
        return "it lies outside the working copy " + nativePath(root).string();
    }
    if (text.find(u'\\') != ustring::npos)
    {
        return "a backslash in a name is taken for a slash";
    }
    if (isFollowed(named.path, root))
    {
        return "no file of this name is known to Git";
    }
    std::error_code ignored;
    if (isPattern(relativeName(upath(text), root)) && fs::exists(path, ignored))
    {
        return "*, ? and [ in a name are taken for a pattern";
    }
    if (fs::is_directory(path, ignored))
    {
        return "there are no files in it but ignored ones";
    }
    return fs::exists(path, ignored) ? "it is ignored by Git" : "there is no such file";
}

void refuseStrays(const std::string &refusal, CMAdapter &adapter,
                  const std::vector<NamedPath> &paths, const std::vector<upath> &list,
                  const std::function<bool(FileState::State)> &matters)
{
    const upath &root = adapter.getRootFolder();
    if (std::none_of(list.begin(), list.end(),
                     [&root](const upath &path) {
                         return liesIn(path.string(), root.string()) &&
                                isPattern(relativeName(path, root));
                     }))
    {
        return;
    }
    FileStateMap strays = filter(adapter.getFileStates(list), matters);
    for (const NamedPath &named : paths)
    {
        for (const auto &[path, state] : named.states)
        {
            strays.erase(path);
        }
    }
    if (!strays.empty())
    {
        throw ShellFailure(refusal +
                           ". A name with *, ? or [ is a pattern, and means these files too:" +
                           listNames(strays, root) + "\nName them as well, if they are meant.");
    }
}

std::string explainUntracked(const upath &root, const NamedPath &named)
{
    if (named.states.empty())
    {
        return explainAbsence(root, named);
    }
    if (filter(named.states, isTracked).empty())
    {
        return named.isFolder ? "Git tracks no file in it" : "it is not tracked by Git";
    }
    return {};
}

std::string explainLink(const NamedPath &named, const std::string &instead)
{
    if (!named.isLink)
    {
        return {};
    }
    std::error_code ignored;
    const bool isBehind = !fs::is_symlink(nativePath(named.path), ignored);
    return std::string(isBehind ? "it lies behind a symbolic link" : "it is a symbolic link") +
           ", which would be followed: use \"" + instead + '"';
}

FileStateMap findLeftOut(CMAdapter &adapter, const FileStateMap &files,
                         const std::function<bool(FileState::State)> &matters)
{
    FileStateMap leftOut;
    if (!files.empty())
    {
        for (const auto &entry : filter(statesAfterwards(adapter, files), matters))
        {
            if (files.count(entry.first) != 0)
            {
                leftOut.insert(leftOut.end(), entry);
            }
        }
    }
    return leftOut;
}

ExitStatus tellLeftOut(const std::string &refusal, const upath &root, const FileStateMap &leftOut)
{
    // In the order in which they are told.
    FileStateMap unnamable;
    FileStateMap followed;
    FileStateMap others;
    for (const auto &entry : leftOut)
    {
        FileStateMap &files = !isAddressable(entry.first, root) ? unnamable
                              : isFollowed(entry.first, root)   ? followed
                                                                : others;
        files.insert(files.end(), entry);
    }
    const auto tell = [&](const std::string &reason, const FileStateMap &files)
    {
        if (!files.empty())
        {
            complain(refusal + reason + listNames(files, root));
        }
    };
    tell(", as a backslash in a name is taken for a slash:", unnamable);
    tell(", as a symbolic link would be followed:", followed);
    tell(", for a reason that is not known:", others);
    return leftOut.empty() ? Done : Failed;
}

} // namespace vclink::shell
