// SPDX-License-Identifier: MIT
#include "expectedStates.hpp"

#include <vector>

#include <gtest/gtest.h>

#include "moves.hpp"
#include "support/text.hpp"

namespace vclink::test
{
namespace
{

/// One state for each file: the first of these that holds.
FileState::State stateOf(const IndexChange &change, const GitFile &workTree)
{
    if (workTree.unmerged)
    {
        return FileState::InConflict;
    }
    if (change.letter == 'A')
    {
        return FileState::Added;
    }
    if (change.letter == 'M' || change.edited || workTree.workTree == 'M')
    {
        return FileState::Modified;
    }
    if (change.letter == 'D')
    {
        return FileState::Deleted;
    }
    if (workTree.untracked)
    {
        return FileState::Unversioned;
    }
    if (workTree.workTree == 'D')
    {
        return FileState::Missing;
    }
    // Another type in the index or in the working tree, or moved as it is: no state of its own.
    const bool changed = change.letter != '.' || workTree.workTree != '.';
    return changed ? FileState::Unknown : FileState::Clean;
}

/// A file that is only intended to be added is in the index, without content. Git reports it as new
/// in the working tree; here what is in the index and not in HEAD is new in the index, and differs
/// in the working tree as other files do.
GitFile withIntentionAsAddition(GitFile file)
{
    const bool intended = file.workTree == 'A' || (file.workTree == 'D' && file.headMode == noMode);
    if (file.index == '.' && intended)
    {
        file.index = 'A';
    }
    if (file.workTree == 'A')
    {
        const bool sameType = file.workTreeMode.compare(0, 2, file.indexMode, 0, 2) == 0;
        const bool same = file.workTreeMode == file.indexMode && !file.hasBytes;
        file.workTree = !sameType ? 'T' : same ? '.' : 'M';
    }
    return file;
}

/// A folder with a trailing slash and the file of that name are the same path.
bool isKnown(const std::string &path, const States &states)
{
    return path.back() == '/' && states.count(path.substr(0, path.size() - 1)) != 0;
}

} // namespace

States statesByPath(const std::string &root, const FileStateMap &states)
{
    States below;
    for (const auto &[path, state] : states)
    {
        const std::string name = asBytes(path);
        EXPECT_EQ(name.substr(0, root.size() + 1), root + '/');
        below.emplace(name.substr(root.size() + 1), state.getState());
    }
    return below;
}

States statesOfAll(CMAdapter &adapter)
{
    const upath root = adapter.getRootFolder();
    return statesByPath(asBytes(root), adapter.getFolderStates(root));
}

States expectedStates(const GitReport &report, const Blobs &blobs,
                      const std::function<bool(const std::string &path)> &isAsked)
{
    GitReport asked;
    std::vector<IndexChange> changes;
    for (const auto &[path, file] : report)
    {
        if (isAsked(path))
        {
            const GitFile &here = asked[path] = withIntentionAsAddition(file);
            changes.push_back({path, path, here.index, here.headMode, here.headId, here.indexMode,
                               here.indexId, false});
        }
    }
    joinMoves(changes, blobs);

    // Entries come by the places that they have in the index and the working tree; of a place's
    // changes in the index the first has the state of the working tree too.
    States states;
    for (const auto &change : changes)
    {
        const auto workTree = asked.find(change.place);
        const GitFile here = workTree == asked.end() ? GitFile() : workTree->second;
        if (workTree != asked.end())
        {
            asked.erase(workTree);
        }
        const bool isThere = change.letter != '.' || change.indexMode != noMode || here.untracked;
        if (isThere && !isKnown(change.path, states))
        {
            // If two entries have one path, the first one counts.
            states.emplace(change.path, stateOf(change, here));
        }
    }
    return states;
}

} // namespace vclink::test
