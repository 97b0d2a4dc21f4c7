// SPDX-License-Identifier: MIT
#include "checkedOutBranches.hpp"

#include <algorithm>
#include <fstream>
#include <system_error>

#include "failures.hpp"
#include "gitProgram.hpp"
#include "names.hpp"
#include "texts.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

namespace fs = std::filesystem;

std::string readLine(const fs::path &path)
{
    std::ifstream file(path);
    std::string line;
    std::getline(file, line);
    return line;
}

/// What HEAD or a branch names: a symbolic link does with core.preferSymlinkRefs.
std::string readReference(const fs::path &path)
{
    std::error_code noLink;
    const std::string link = fs::read_symlink(path, noLink).string();
    return link.rfind("refs/", 0) == 0 ? link : readLine(path);
}

/// The NAME of "ref: refs/heads/NAME", or of "refs/heads/NAME" as a rebase keeps it.
std::string shortName(const std::string &line)
{
    const std::string folder = "refs/heads/";
    const std::size_t place = line.find(folder);
    return place == 0 || place == std::string("ref: ").size() ? line.substr(place + folder.size())
                                                              : std::string();
}

/// Where git keeps the state of a working copy.
struct State
{
    fs::path folder;
    /// of the working copy, which may be gone; empty if it is unknown
    fs::path root;
    bool isOwn;
};

void takeMoved(const State &state, std::vector<CheckedOutBranch> &branches)
{
    std::ifstream file(state.folder / "rebase-merge/update-refs");
    std::string line;
    std::string id;
    for (; std::getline(file, line); std::getline(file, id), std::getline(file, id))
    {
        const std::string name = shortName(line);
        if (!name.empty())
        {
            branches.push_back({name, state.root, state.isOwn, true});
        }
    }
}

/// The branch that HEAD names and, if that is a symbolic reference, those that it leads to.
void takeCurrent(const State &state, const fs::path &shared,
                 std::vector<CheckedOutBranch> &branches)
{
    // git follows no more.
    constexpr int longestChain = 5;
    std::string name = shortName(readReference(state.folder / "HEAD"));
    for (int step = 0; !name.empty() && step < longestChain; ++step)
    {
        branches.push_back({name, state.root, state.isOwn, false});
        name = shortName(readReference(shared / "refs/heads" / name));
    }
}

void take(const State &state, const fs::path &shared, std::vector<CheckedOutBranch> &branches)
{
    takeCurrent(state, shared, branches);
    for (const std::string &line : {readLine(state.folder / "rebase-merge/head-name"),
                                    readLine(state.folder / "rebase-apply/head-name")})
    {
        const std::string name = shortName(line);
        if (!name.empty())
        {
            branches.push_back({name, state.root, state.isOwn, false});
        }
    }
    // The name of the branch, or the id of a commit.
    const std::string start = readLine(state.folder / "BISECT_START");
    if (!start.empty())
    {
        branches.push_back({start, state.root, state.isOwn, false});
    }
    takeMoved(state, branches);
}

/// Its HEAD checks nothing out, even if its folder is called ".git".
bool isBare(const fs::path &state)
{
    return runGit(state, {"rev-parse", "--is-bare-repository"}) == "true\n";
}

/// A repository does not say where its main working copy is: its folder can be elsewhere, as that
/// of a submodule is, or with "git init --separate-git-dir".
fs::path mainRoot(const fs::path &shared)
{
    return shared.filename() == ".git" ? shared.parent_path() : fs::path();
}

/// Without those that git has forgotten.
std::vector<State> findStates(const fs::path &shared)
{
    std::vector<State> states;
    if (!isBare(shared))
    {
        states.push_back({shared, mainRoot(shared), false});
    }
    std::error_code ignored;
    for (const auto &entry : fs::directory_iterator(shared / "worktrees", ignored))
    {
        const std::string place = readLine(entry.path() / "gitdir");
        if (!place.empty())
        {
            const fs::path file = (entry.path() / place).lexically_normal();
            states.push_back({entry.path(), file.parent_path(), false});
        }
    }
    return states;
}

} // namespace

std::vector<CheckedOutBranch> findCheckedOutBranches(const fs::path &root)
{
    std::error_code ignored;
    const fs::path own = fs::weakly_canonical(stateFolder(root), ignored);
    const fs::path shared = fs::weakly_canonical(sharedFolder(own), ignored);
    std::vector<CheckedOutBranch> branches;
    for (State &state : findStates(shared))
    {
        state.isOwn = state.folder == own;
        state.root = state.isOwn ? root : state.root;
        take(state, shared, branches);
    }
    return branches;
}

std::optional<CheckedOutBranch> findOtherWorkingCopy(const fs::path &root,
                                                     const std::string &branch)
{
    const std::vector<CheckedOutBranch> branches = findCheckedOutBranches(root);
    const auto found = std::find_if(branches.begin(), branches.end(),
                                    [&branch](const CheckedOutBranch &checkedOut) {
                                        return !checkedOut.isOwn && !checkedOut.isMoved &&
                                               checkedOut.name == branch;
                                    });
    return found == branches.end() ? std::nullopt : std::optional(*found);
}

void refuseMissingFolder(const CheckedOutBranch &branch)
{
    std::error_code ignored;
    if (!branch.root.empty() && !fs::exists(branch.root, ignored))
    {
        throw ShellFailure(say("The branch '%1%' is checked out in the working copy %2%, whose "
                               "folder is missing.\nIf it is gone for good, use \"git worktree "
                               "prune\" first.",
                               showName(branch.name), quoteName(makePath(branch.root).string())));
    }
}

std::string showPlace(const CheckedOutBranch &branch)
{
    return branch.root.empty()
               ? say("the main working copy")
               : say("the working copy %1%", quoteName(makePath(branch.root).string()));
}

} // namespace vclink::shell
