// SPDX-License-Identifier: MIT
#include "unfinished.hpp"

#include <filesystem>
#include <fstream>
#include <string>
#include <system_error>

#include "failures.hpp"
#include "names.hpp"
#include "vclink/git/BranchManager.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

namespace fs = std::filesystem;

/// What is done commit by commit, or step by step.
struct Operation
{
    /// The back end's word for it.
    const char *state;
    const char *name;
    const char *wayOn;
};

constexpr const char *goOnRebasing = "Go on with \"git rebase --continue\"";
constexpr Operation operations[] = {
    {"Bisecting", "a bisection", "End it with \"git bisect reset\""},
    {"Rebase", "a rebase", goOnRebasing},
    {"Rebase interactive", "a rebase", goOnRebasing},
    {"Rebase w/merge", "a rebase", goOnRebasing},
    {"Apply mailbox", "the application of a mailbox", "Go on with \"git am --continue\""},
    {"Rebase/Apply mailbox", "a rebase or the application of a mailbox",
     "Go on with \"git rebase --continue\", or \"git am --continue\""}};
/// To the back end one commit that is picked and several are the same.
constexpr Operation series = {"", "a series of picked or reverted commits",
                              "Go on with \"git cherry-pick --continue\", or \"git revert "
                              "--continue\""};

/// Whether commits are still to be picked or reverted after the one that is under way.
bool isInSeries(const fs::path &root)
{
    std::ifstream steps(stateFolder(root) / "sequencer" / "todo");
    std::size_t count = 0;
    for (std::string step; std::getline(steps, step);)
    {
        count += step.empty() ? 0 : 1;
    }
    return count > 1;
}

const Operation *findOperation(CMAdapter &adapter)
{
    const std::string state = git::BranchManager::create(adapter)->getRepositoryState();
    for (const Operation &operation : operations)
    {
        if (state == operation.state)
        {
            return &operation;
        }
    }
    return isInSeries(nativePath(adapter.getRootFolder())) ? &series : nullptr;
}

bool stands(CMAdapter &adapter, const char *name)
{
    std::error_code ignored;
    return fs::exists(stateFolder(nativePath(adapter.getRootFolder())) / name, ignored);
}

bool isMerging(CMAdapter &adapter)
{
    return git::BranchManager::create(adapter)->getRepositoryState() == "Conflicts" &&
           stands(adapter, "MERGE_HEAD");
}

} // namespace

void refuseHalfWay(CMAdapter &adapter)
{
    if (const Operation *const operation = findOperation(adapter))
    {
        throw ShellFailure(std::string("Nothing was committed, because ") + operation->name +
                           " is under way.\nThe commit would end it, and drop what is left of it; "
                           "with --as-is it is made all the same.\n" +
                           operation->wayOn + '.');
    }
}

bool isMergeInterrupted(CMAdapter &adapter)
{
    // Of the library; it removes what is left of it once no merge is under way. git's merges leave
    // the other file.
    return isMerging(adapter) && stands(adapter, "vclink-merge") && !stands(adapter, "AUTO_MERGE");
}

std::string describeUnfinishedMerge(CMAdapter &adapter)
{
    if (!isMerging(adapter))
    {
        return {};
    }
    return isMergeInterrupted(adapter)
               ? std::string("A merge was interrupted before all of it was written, and can't be "
                             "concluded. \"vclink-shell commit\"\nsays so, and names the commands "
                             "that bring the working copy back as it was before.") +
                     (stands(adapter, "index.lock")
                          ? "\nRemove .git/index.lock first, unless another program is using Git "
                            "here just now."
                          : "")
               : "A merge is under way. Conclude it with \"vclink-shell commit\", or undo it with "
                 "\"git merge --abort\".";
}

} // namespace vclink::shell
