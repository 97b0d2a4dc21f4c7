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

/// The NAME of "ref: refs/heads/NAME", or of "refs/heads/NAME" as a rebase keeps it.
std::string shortName(const std::string &line)
{
    const std::string folder = "refs/heads/";
    const std::size_t place = line.find(folder);
    return place == 0 || place == std::string("ref: ").size() ? line.substr(place + folder.size())
                                                              : std::string();
}

/// The root of the working copy whose state is in this folder, which may be gone; empty if it is
/// unknown.
fs::path rootOf(const fs::path &state)
{
    const std::string entry = readLine(state / "gitdir");
    const fs::path place = entry.empty() ? state : (state / entry).lexically_normal();
    return place.filename() == ".git" ? place.parent_path() : fs::path();
}

void take(const fs::path &state, bool isOwn, std::vector<CheckedOutBranch> &branches)
{
    const fs::path root = rootOf(state);
    if (root.empty())
    {
        return;
    }
    for (const char *const file : {"HEAD", "rebase-merge/head-name", "rebase-apply/head-name"})
    {
        const std::string name = shortName(readLine(state / file));
        if (!name.empty())
        {
            branches.push_back({name, root, isOwn});
        }
    }
    // The name of the branch, or the id of a commit.
    const std::string start = readLine(state / "BISECT_START");
    if (!start.empty())
    {
        branches.push_back({start, root, isOwn});
    }
}

/// Its HEAD checks nothing out, even if its folder is called ".git".
bool isBare(const fs::path &state)
{
    return runGit(state, {"rev-parse", "--is-bare-repository"}) == "true\n";
}

} // namespace

std::vector<CheckedOutBranch> findCheckedOutBranches(const fs::path &root)
{
    std::error_code ignored;
    const fs::path own = fs::weakly_canonical(stateFolder(root), ignored);
    const fs::path shared = fs::weakly_canonical(sharedFolder(own), ignored);
    std::vector<fs::path> states;
    if (!isBare(shared))
    {
        states.push_back(shared);
    }
    for (const auto &entry : fs::directory_iterator(shared / "worktrees", ignored))
    {
        states.push_back(entry.path());
    }
    std::vector<CheckedOutBranch> branches;
    for (const fs::path &state : states)
    {
        take(state, state == own, branches);
    }
    return branches;
}

std::optional<CheckedOutBranch> findOtherWorkingCopy(const fs::path &root,
                                                     const std::string &branch)
{
    const std::vector<CheckedOutBranch> branches = findCheckedOutBranches(root);
    const auto found = std::find_if(branches.begin(), branches.end(),
                                    [&branch](const CheckedOutBranch &checkedOut)
                                    { return !checkedOut.isOwn && checkedOut.name == branch; });
    return found == branches.end() ? std::nullopt : std::optional(*found);
}

void refuseMissingFolder(const CheckedOutBranch &branch)
{
    std::error_code ignored;
    if (!fs::exists(branch.root, ignored))
    {
        throw ShellFailure(say("The branch '%1%' is checked out in the working copy %2%, whose "
                               "folder is missing.\nIf it is gone for good, use \"git worktree "
                               "prune\" first.",
                               showName(branch.name), quoteName(makePath(branch.root).string())));
    }
}

} // namespace vclink::shell
