// SPDX-License-Identifier: MIT
#include "Snapshot.hpp"

#include <set>

#include "Work.hpp"
#include "hostTools.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::desktop
{
namespace
{

std::vector<std::string> shortNames(const std::vector<git::BranchPointer> &branches,
                                    const std::string &prefix)
{
    std::vector<std::string> names;
    for (const auto &branch : branches)
    {
        if (branch.getName().rfind(prefix, 0) == 0)
            names.push_back(branch.getName().substr(prefix.size()));
    }
    return names;
}

std::string currentBranch(const git::BranchManager &manager)
{
    try
    {
        return manager.getCurrentBranch().getName();
    }
    catch (const git::LibGit2Exception &)
    {
        // Before the first commit, and with a detached HEAD.
        return {};
    }
}

} // namespace

std::vector<upath> Snapshot::filesWith(FileState::State state) const
{
    std::vector<upath> files;
    for (const auto &[path, its] : states)
    {
        if (its.getState() == state)
            files.push_back(path);
    }
    return files;
}

std::vector<upath> Snapshot::changedFiles() const
{
    std::vector<upath> files;
    for (const auto &[path, state] : states)
    {
        if (state.getState() != FileState::Clean && state.getState() != FileState::Unversioned)
            files.push_back(path);
    }
    return files;
}

std::vector<std::string> Snapshot::remotes() const
{
    std::set<std::string> names{"origin"};
    for (const auto &name : remoteBranches)
        names.insert(name.substr(0, name.find('/')));
    return {names.begin(), names.end()};
}

Snapshot readSnapshot(Work &work)
{
    const auto manager = work.branches();
    Snapshot snapshot;
    snapshot.root = work.root();
    snapshot.branch = currentBranch(*manager);
    snapshot.localBranches = shortNames(manager->getLocalBranches(), "refs/heads/");
    snapshot.remoteBranches = shortNames(manager->getRemoteBranches(), "refs/remotes/");
    snapshot.repositoryState = manager->getRepositoryState();
    snapshot.states = host_tools::readStates(work.adapter());
    return snapshot;
}

} // namespace vclink::desktop
