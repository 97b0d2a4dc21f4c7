// SPDX-License-Identifier: MIT
#include "renames.hpp"

#include <algorithm>

#include "indexEntries.hpp"
#include "names.hpp"

namespace vclink::shell
{
namespace
{

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
    for (const StagedChange &change : readStagedChanges(root).value_or(std::vector<StagedChange>()))
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
