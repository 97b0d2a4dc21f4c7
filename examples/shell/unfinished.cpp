// SPDX-License-Identifier: MIT
#include "unfinished.hpp"

#include <filesystem>
#include <fstream>
#include <optional>
#include <string>
#include <system_error>
#include <vector>

#include "failures.hpp"
#include "gitProgram.hpp"
#include "names.hpp"
#include "texts.hpp"
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
    std::string description;
};

std::vector<Operation> operations()
{
    const std::string rebase = say("A rebase is under way. Continue it with \"git rebase "
                                   "--continue\", or undo it with \"git rebase --abort\".");
    return {{"Bisecting", say("A bisection is under way. End it with \"git bisect reset\".")},
            {"Rebase", rebase},
            {"Rebase interactive", rebase},
            {"Rebase w/merge", rebase},
            {"Apply mailbox", say("Patches are being applied. Continue with \"git am "
                                  "--continue\", or undo it with \"git am --abort\".")},
            {"Rebase/Apply mailbox",
             say("A rebase or the application of patches is under way. Continue with \"git rebase "
                 "--continue\"\nor \"git am --continue\", or undo it with --abort.")}};
}

/// To the back end one commit that is picked and several are the same.
std::string describeSeries()
{
    return say("A series of picked or reverted commits is under way. Continue with \"git "
               "cherry-pick --continue\"\nor \"git revert --continue\", or undo it with --abort.");
}

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

/// The operation with more than one commit that is under way; empty if there is none.
std::string describeOperation(CMAdapter &adapter)
{
    const std::string state = git::BranchManager::create(adapter)->getRepositoryState();
    for (const Operation &operation : operations())
    {
        if (state == operation.state)
        {
            return operation.description;
        }
    }
    return isInSeries(nativePath(adapter.getRootFolder())) ? describeSeries() : std::string();
}

bool stands(CMAdapter &adapter, const char *name)
{
    std::error_code ignored;
    return fs::exists(stateFolder(nativePath(adapter.getRootFolder())) / name, ignored);
}

/// Name and address from "NAME <ADDRESS> TIME".
std::string personOf(const std::string &identity)
{
    return identity.substr(0, identity.find('>'));
}

/// The author of the commit that is being picked, if it can be found out.
std::optional<std::string> findPickedAuthor(const fs::path &root)
{
    const auto commit = runGit(root, {"cat-file", "commit", "CHERRY_PICK_HEAD"});
    const std::string word = "\nauthor ";
    const std::size_t begin = commit.value_or("").find(word);
    return begin == std::string::npos
               ? std::nullopt
               : std::optional(personOf(commit->substr(begin + word.size())));
}

/// Whether another person's commit is being picked. git's commit keeps its author.
bool isPickOfAnother(CMAdapter &adapter)
{
    if (!stands(adapter, "CHERRY_PICK_HEAD"))
    {
        return false;
    }
    const fs::path root = nativePath(adapter.getRootFolder());
    const std::optional<std::string> author = findPickedAuthor(root);
    // The back end does not know the settings of the author alone.
    return author && *author != personOf(runGit(root, {"-c", "author.name=", "-c",
                                                       "author.email=", "var", "GIT_AUTHOR_IDENT"})
                                             .value_or(""));
}

std::string describePickOfAnother()
{
    return say("A commit of another author is being picked. Conclude it with \"git commit\", which "
               "keeps the author, or\nundo it with \"git cherry-pick --abort\".");
}

} // namespace

void refuseHalfWay(CMAdapter &adapter)
{
    // Between two steps of a series, a commit keeps the others, as in git.
    if (git::BranchManager::create(adapter)->getRepositoryState() == "Normal")
    {
        return;
    }
    const std::string operation = describeOperation(adapter);
    if (!operation.empty())
    {
        throw ShellFailure(say("Nothing was committed. %1%\nA commit would end it, and lose its "
                               "other steps. To commit nevertheless, use --as-is.",
                               operation));
    }
    if (isPickOfAnother(adapter))
    {
        throw ShellFailure(say("Nothing was committed. %1%\nTo commit it under your own name, use "
                               "--as-is.",
                               describePickOfAnother()));
    }
}

bool isMergeUnderWay(CMAdapter &adapter)
{
    return git::BranchManager::create(adapter)->getRepositoryState() == "Conflicts" &&
           stands(adapter, "MERGE_HEAD");
}

bool isMergeInterrupted(CMAdapter &adapter)
{
    // The library's file; the library removes an old one when no merge is under way. git's merges
    // leave the other file.
    return isMergeUnderWay(adapter) && stands(adapter, "vclink-merge") &&
           !stands(adapter, "AUTO_MERGE");
}

std::string describeUnfinishedMerge(CMAdapter &adapter)
{
    if (!isMergeUnderWay(adapter))
    {
        return {};
    }
    if (!isMergeInterrupted(adapter))
    {
        return say(
            "A merge is under way. Conclude it with \"vclink-shell commit\", or undo it with "
            "\"git merge --abort\".");
    }
    const std::string lock =
        say("If no other program is using Git here, remove .git/index.lock first.");
    return say("A merge was interrupted before all of it was written, and can't be concluded. "
               "\"vclink-shell commit\"\nprints the commands that restore the working copy.") +
           (stands(adapter, "index.lock") ? '\n' + lock : std::string());
}

std::string describeUnfinished(CMAdapter &adapter)
{
    std::string text = describeUnfinishedMerge(adapter);
    text = text.empty() ? describeOperation(adapter) : text;
    if (text.empty() && isPickOfAnother(adapter))
    {
        return describePickOfAnother();
    }
    const bool isNormal = git::BranchManager::create(adapter)->getRepositoryState() == "Normal";
    return text.empty() && !isNormal
               ? say("A commit is being picked or reverted. Conclude it with \"vclink-shell "
                     "commit\", or undo it with\n\"git cherry-pick --abort\" or \"git revert "
                     "--abort\".")
               : text;
}

} // namespace vclink::shell
