// SPDX-License-Identifier: MIT
#include "renames.hpp"

#include <algorithm>
#include <cstddef>
#include <filesystem>
#include <system_error>

#include "indexEntries.hpp"
#include "names.hpp"

namespace vclink::shell
{
namespace
{

namespace fs = std::filesystem;

/// Files below the places, or the places themselves, that have no state: the new names of renamed
/// files, and ignored files. None if there are many.
std::vector<upath> withoutState(const std::vector<upath> &places, const FileStateMap &states)
{
    constexpr std::size_t most = 500;
    std::vector<upath> files;
    const auto take = [&](const fs::directory_entry &entry)
    {
        std::error_code ignored;
        const upath path = makePath(entry.path());
        if (entry.is_regular_file(ignored) && states.count(path) == 0)
        {
            files.push_back(path);
        }
    };
    for (const upath &place : places)
    {
        std::error_code error;
        take(fs::directory_entry(nativePath(place), error));
        const auto options = fs::directory_options::skip_permission_denied;
        for (fs::recursive_directory_iterator entry(nativePath(place), options, error), end;
             !error && entry != end && files.size() <= most; entry.increment(error))
        {
            std::error_code ignored;
            if (entry->path().filename() == ".git" || fs::exists(entry->path() / ".git", ignored))
            {
                entry.disable_recursion_pending();
                continue;
            }
            take(*entry);
        }
    }
    return files.size() > most ? std::vector<upath>() : files;
}

/// The back end has a state of its own for the old name of a renamed file, and none for the new
/// one. Asked for one name without the other, it has those of a deleted and of a new file.
void separateByAsking(CMAdapter &adapter, const std::vector<upath> &asked, FileStateMap &states)
{
    bool isRenamed = false;
    for (auto &[path, state] : states)
    {
        if (state.getState() == FileState::Unknown)
        {
            const FileStateMap own = adapter.getFileStates({path});
            const auto found = own.find(path);
            if (found != own.end() && found->second.getState() == FileState::Deleted)
            {
                state = found->second;
                isRenamed = true;
            }
        }
    }
    if (!isRenamed)
    {
        return;
    }
    const std::vector<upath> candidates = withoutState(asked, states);
    for (const auto &entry : adapter.getFileStates(candidates))
    {
        const bool isCandidate =
            std::find(candidates.begin(), candidates.end(), entry.first) != candidates.end();
        if (isCandidate && entry.second.getState() == FileState::Added)
        {
            states.insert(entry);
        }
    }
}

void separate(CMAdapter &adapter, const std::vector<upath> &asked, FileStateMap &states)
{
    // A renamed file is not clean, whatever else it is.
    if (std::all_of(states.begin(), states.end(),
                    [](const FileStateMap::value_type &entry)
                    { return entry.second.getState() == FileState::Clean; }))
    {
        return;
    }
    const std::filesystem::path root = nativePath(adapter.getRootFolder());
    const auto changes = readStagedChanges(root);
    if (!changes)
    {
        separateByAsking(adapter, asked, states);
        return;
    }
    for (const StagedChange &change : *changes)
    {
        const upath path = makePath(root / change.name);
        const bool isAsked = std::any_of(asked.begin(), asked.end(),
                                         [&path](const upath &place)
                                         { return liesIn(path.string(), place.string()); });
        const auto known = states.find(path);
        if (isAsked && change.isAdded() && known == states.end())
        {
            states.emplace(path, FileState(FileState::Added));
        }
        else if (change.isDeleted() && known != states.end() &&
                 known->second.getState() != FileState::InConflict)
        {
            known->second = FileState(FileState::Deleted);
        }
    }
}

} // namespace

FileStateMap folderStates(CMAdapter &adapter, const upath &folder)
{
    FileStateMap states = adapter.getFolderStates(folder);
    separate(adapter, {canonicalForm(folder)}, states);
    return states;
}

FileStateMap fileStates(CMAdapter &adapter, const std::vector<upath> &files)
{
    FileStateMap states = adapter.getFileStates(files);
    separate(adapter, files, states);
    return states;
}

} // namespace vclink::shell
