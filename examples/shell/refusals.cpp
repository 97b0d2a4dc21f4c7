// SPDX-License-Identifier: MIT
#include "refusals.hpp"

#include <algorithm>
#include <filesystem>
#include <system_error>

#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "links.hpp"
#include "names.hpp"
#include "renames.hpp"
#include "states.hpp"
#include "texts.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

namespace fs = std::filesystem;

/// Whether anything lies in a folder, or below it, that Git could track.
bool hasFiles(const fs::path &folder)
{
    std::error_code error;
    const auto options = fs::directory_options::skip_permission_denied;
    for (fs::recursive_directory_iterator entry(folder, options, error), end;
         !error && entry != end; entry.increment(error))
    {
        std::error_code ignored;
        if (entry->path().filename() == ".git")
        {
            entry.disable_recursion_pending();
            continue;
        }
        if (entry->is_symlink(ignored) || entry->is_regular_file(ignored))
        {
            return true;
        }
    }
    return false;
}

/// One question for the whole is cheaper than one for each file, but may be one without an answer.
FileStateMap statesAfterwards(CMAdapter &adapter, const FileStateMap &files)
{
    FileStateMap states = folderStates(adapter, adapter.getRootFolder());
    if (states.empty())
    {
        states = fileStates(adapter, addressable(files, adapter.getRootFolder()));
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
        return say("it lies outside the working copy %1%", nativePath(root).string());
    }
    if (text.find(u'\\') != ustring::npos)
    {
        return say("a backslash in a name is read as a slash");
    }
    if (isFollowed(named.path, root))
    {
        return say("Git knows no file of this name");
    }
    std::error_code ignored;
    const fs::file_status status = fs::status(path, ignored);
    if (!fs::exists(status))
    {
        return say("there is no such file");
    }
    if (isPattern(relativeName(upath(text), root)))
    {
        return say("a name with *, ? or [ is read as a pattern");
    }
    if (fs::is_directory(status) && path != nativePath(root) && hasGitEntry(path))
    {
        return say("it is a repository of its own: use \"%1%\"", "git submodule add");
    }
    if (fs::is_directory(status))
    {
        return hasFiles(path) ? say("it has only ignored files") : say("it has no files");
    }
    return fs::is_regular_file(status)
               ? say("it is ignored by Git")
               : say("it is a FIFO, socket or device, which Git does not track");
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
        throw ShellFailure(
            say("%1%.", refusal) + '\n' +
            say("A name with *, ? or [ is a pattern, and matches these files too:%1%\nName them as "
                "well if you want them, or use git for the file with that name.",
                listNames(strays)));
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
        return named.isFolder ? say("Git tracks no file in it") : say("it is not tracked by Git");
    }
    return {};
}

bool isRepository(const upath &entry)
{
    return entry.string().back() == u'/';
}

std::string explainLink(const NamedPath &named, const std::string &instead)
{
    if (!named.isLink)
    {
        return {};
    }
    std::error_code ignored;
    const bool isBehind = !fs::is_symlink(nativePath(named.path), ignored);
    return isBehind ? say("it lies behind a symbolic link, which would be followed: use \"%1%\"",
                          instead)
                    : say("it is a symbolic link, which would be followed: use \"%1%\"", instead);
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
    FileStateMap repositories;
    FileStateMap unnamable;
    FileStateMap followed;
    FileStateMap submodules;
    FileStateMap others;
    for (const auto &entry : leftOut)
    {
        FileStateMap &files = isRepository(entry.first)              ? repositories
                              : !isAddressable(entry.first, root)    ? unnamable
                              : isFollowed(entry.first, root)        ? followed
                              : hasGitEntry(nativePath(entry.first)) ? submodules
                                                                     : others;
        files.insert(files.end(), entry);
    }
    const auto tell = [&](const std::string &reason, const FileStateMap &files)
    {
        if (!files.empty())
        {
            complain(say("%1%, %2%%3%", refusal, reason, listNames(files)));
        }
    };
    tell(say("because these are repositories of their own:"), repositories);
    tell(say("because a backslash in a name is read as a slash:"), unnamable);
    tell(say("because a symbolic link would be followed:"), followed);
    tell(say("because a submodule keeps its commit until \"git submodule update\":"), submodules);
    tell(say("for an unknown reason:"), others);
    return leftOut.empty() ? Done : Failed;
}

} // namespace vclink::shell
