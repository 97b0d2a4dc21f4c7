// SPDX-License-Identifier: MIT
#include <array>

#include <git2.h>

#include "Operation.hpp"
#include "repositories.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/BranchParameters.hpp"
#include "vclink/git/BranchPointer.hpp"

namespace vclink::test
{
namespace
{

using git::BranchManager;

std::string namesOf(const std::vector<git::BranchPointer> &branches)
{
    std::string text;
    for (const auto &branch : branches)
        text += branch.getName() + ' ';
    return text;
}

/// An operation of a branch manager that answers with a text.
std::function<Action(const Subject &)> asking(std::string (*operation)(BranchManager &))
{
    return [=](const Subject &subject) -> Action
    {
        const std::shared_ptr<BranchManager> branches = BranchManager::create(*subject.adapter);
        return [=, adapter = subject.adapter] { return operation(*branches); };
    };
}

/// One that answers with nothing.
std::function<Action(const Subject &)> doing(void (*operation)(BranchManager &))
{
    return [=](const Subject &subject) -> Action
    {
        const std::shared_ptr<BranchManager> branches = BranchManager::create(*subject.adapter);
        return [=, adapter = subject.adapter]
        {
            operation(*branches);
            return std::string();
        };
    };
}

std::string getLocalBranches(BranchManager &branches)
{
    return namesOf(branches.getLocalBranches());
}

std::string getRemoteBranches(BranchManager &branches)
{
    return namesOf(branches.getRemoteBranches());
}

std::string getHeadRevision(BranchManager &branches)
{
    return branches.getHeadRevision();
}

std::string getRevisionId(BranchManager &branches)
{
    std::array<char, GIT_OID_HEXSZ + 1> digits{};
    const git_oid id = branches.getRevisionId("topic");
    return git_oid_tostr(digits.data(), digits.size(), &id);
}

std::string getCurrentBranch(BranchManager &branches)
{
    return branches.getCurrentBranch().getName();
}

std::string getRepositoryState(BranchManager &branches)
{
    return branches.getRepositoryState();
}

void switchBranch(BranchManager &branches)
{
    branches.switchBranch("topic");
}

void switchToCurrentBranch(BranchManager &branches)
{
    branches.switchBranch("main");
}

void createBranch(BranchManager &branches)
{
    branches.createBranch(git::BranchParameters("fresh", "topic"));
}

void deleteBranch(BranchManager &branches)
{
    branches.deleteBranch("topic");
}

void merge(BranchManager &branches)
{
    branches.merge("topic");
}

} // namespace

std::vector<Operation> branchOperations()
{
    const std::vector<std::vector<std::string>> abort{{"reset", "--quiet", "--hard"},
                                                      {"clean", "--quiet", "--force"}};
    // What is marked is not put back.
    const std::vector<std::vector<std::string>> abortHidden{
        {"update-index", "--no-skip-worktree", "link", "sub/inside"},
        {"reset", "--quiet", "--hard"},
        {"update-index", "--skip-worktree", "link", "sub/inside"}};
    const std::string badState = "vclink::git::GitException";
    const std::string refused = "vclink::git::LibGit2Exception";
    return {
        {"getLocalBranches", makeBranches, asking(getLocalBranches), "", {}, false},
        {"listBesideBrokenLink", makeBrokenLink, asking(getLocalBranches), "", {}, false},
        {"getRemoteBranches", makeBranches, asking(getRemoteBranches), "", {}, false},
        {"getHeadRevision", makeBranches, asking(getHeadRevision), "", {}, false},
        {"getRevisionId", makeBranches, asking(getRevisionId), "", {}, false},
        {"getCurrentBranch", makeBranches, asking(getCurrentBranch), "", {}, false},
        {"getRepositoryState", makeConflicted, asking(getRepositoryState), "", {}, false},
        {"switchBranch", makeBranches, doing(switchBranch), refused, abort},
        {"switchToCurrentBranch", makeBranches, doing(switchToCurrentBranch), refused, abort},
        {"switchBranchUnderLink", makeLinkedFolder, doing(switchBranch), refused, abort},
        {"switchBranchOverFolder", makeReplacedFolder, doing(switchBranch), refused, abort},
        {"switchBranchInPartialClone", makePromising, doing(switchBranch), refused, abort},
        {"switchBranchWithSubmodules", makeSubmodules, doing(switchBranch), refused, abort},
        {"switchBranchWithAttributes", makeChangedAttributes, doing(switchBranch), refused, abort},
        {"createBranch", makeBranches, doing(createBranch), refused, {{"branch", "-D", "fresh"}}},
        {"deleteBranch", makeBranches, doing(deleteBranch), refused, {{"branch", "topic"}}},
        {"deleteBranchWithSettings",
         makeSettings,
         doing(deleteBranch),
         refused,
         {{"branch", "topic"}}},
        {"deleteBranchBesideLinkedTree",
         makeLinkedTree,
         doing(deleteBranch),
         refused,
         {{"branch", "topic"}}},
        {"mergeUpToDate", makeUpToDate, doing(merge)},
        {"mergeFastForward", makeBranches, doing(merge), badState, abort},
        {"mergeThreeWay", makeDiverged, doing(merge), badState, abort},
        {"mergeBesideHidden", makeHidden, doing(merge), badState, abortHidden},
        {"mergeOverIgnored", makeIgnored, doing(merge), badState, abort},
        {"mergeBesideLock", makeMergedBesideLock, doing(merge), badState, abort},
        {"mergeFileAndFolder", makeFileAndFolder, doing(merge), badState, abort},
        {"mergeSubmodules", makeDivergedSubmodules, doing(merge), badState, abort},
        {"mergeAttributes", makeDivergedAttributes, doing(merge), badState, abort},
        {"mergeConflict", makeConflict, doing(merge), badState, abort},
        {"mergeUnmergeable", makeUnmergeableConflict, doing(merge), badState, abort},
        {"mergeByTool", makeConflictForTool, doing(merge), badState, abort},
    };
}

} // namespace vclink::test
