// SPDX-License-Identifier: MIT
#include "util/repository/workingTrees.hpp"

#include <algorithm>
#include <array>
#include <cerrno>
#include <climits>
#include <cstddef>
#include <memory>
#include <utility>

#include <dirent.h>
#include <git2/config.h>
#include <git2/errors.h>
#include <git2/repository.h>
#include <sys/stat.h>
#include <unistd.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/raiseGitError.hpp"
#include "error/errorUtil/raiseSystemError.hpp"
#include "util/path/isSameFolder.hpp"
#include "util/repository/linesOf.hpp"
#include "util/repository/settings.hpp"

namespace vclink::git
{
namespace
{

[[noreturn]] void raiseUnreadState(const std::string &path, int error)
{
    raiseSystemError(error, "could not read '" + path + "'");
}

bool isAbsent(int error)
{
    return error == ENOENT || error == ENOTDIR;
}

/// Returns the lines of a file without blanks at their ends; none if there is no such file.
std::vector<std::string> trimmedLinesOf(const std::string &path)
{
    std::vector<std::string> lines = linesOf(path);
    for (std::string &line : lines)
    {
        line.erase(line.find_last_not_of(" \t\r") + 1);
    }
    return lines;
}

/// Returns an empty text if there is no such file.
std::string firstLineOf(const std::string &path)
{
    const std::vector<std::string> lines = trimmedLinesOf(path);
    return lines.empty() ? std::string() : lines.front();
}

/// Returns the reference that a HEAD names; empty if it is detached.
std::string referenceIn(const std::string &head)
{
    const std::string begin = "ref:";
    const std::size_t name = head.find_first_not_of(" \t", begin.size());
    return head.rfind(begin, 0) == 0 && name != std::string::npos ? head.substr(name)
                                                                  : std::string();
}

/// Returns the text of a symbolic link; empty if there is none.
std::string linkIn(const std::string &path)
{
    std::array<char, PATH_MAX> text{};
    const ssize_t size = ::readlink(path.c_str(), text.data(), text.size());
    // EINVAL means that it is no link.
    if (size < 0 && errno != EINVAL && !isAbsent(errno))
    {
        raiseUnreadState(path, errno);
    }
    return size < 0 ? std::string() : std::string(text.data(), static_cast<std::size_t>(size));
}

/// Returns the reference that a symbolic link names, which git makes for core.preferSymlinkRefs;
/// empty for everything else.
std::string linkedReference(const std::string &path)
{
    // With another link in the place of HEAD git finds no repository.
    const std::string link = linkIn(path);
    return link.rfind("refs/", 0) == 0 ? link : std::string();
}

bool isRegularFile(const std::string &path)
{
    struct stat status = {};
    return ::stat(path.c_str(), &status) == 0 && S_ISREG(status.st_mode);
}

/// Returns the reference that another one names; empty if it names a commit or does not exist.
std::string symbolicTarget(const std::string &path)
{
    const std::string link = linkedReference(path);
    // A folder has branches whose names begin so.
    return link.empty() && isRegularFile(path) ? referenceIn(firstLineOf(path)) : link;
}

/// Returns the folder with the branches of a working tree.
std::string folderOfBranches(const std::string &state)
{
    const std::string shared = firstLineOf(state + "commondir");
    if (shared.empty())
    {
        return state;
    }
    return (shared.front() == '/' ? shared : state + shared) + '/';
}

[[noreturn]] void raiseLinkedHead(const std::string &action, const std::string &reference)
{
    raiseGitError(GIT_ERROR, GIT_ERROR_REFERENCE,
                  "cannot " + action + " while HEAD is a symbolic link to '" + reference +
                      "' (core.preferSymlinkRefs), which libgit2 would follow: make it a file with "
                      "'git -c core.preferSymlinkRefs=false symbolic-ref HEAD " +
                      reference + "'");
}

/// git ignores entries without this file's content.
bool isLinked(const std::string &state)
{
    return !firstLineOf(state + "gitdir").empty();
}

/// Returns the paths of what is in a folder, with a slash at their ends; nothing if there is no
/// such folder.
std::vector<std::string> foldersIn(const std::string &path)
{
    // The standard library's iterators end the process if memory runs out.
    const std::unique_ptr<DIR, int (*)(DIR *)> folder(::opendir(path.c_str()), ::closedir);
    if (folder == nullptr && !isAbsent(errno))
    {
        raiseUnreadState(path, errno);
    }
    std::vector<std::string> folders;
    errno = 0;
    while (const dirent *const entry = folder != nullptr ? ::readdir(folder.get()) : nullptr)
    {
        const std::string name = entry->d_name;
        if (name != "." && name != "..")
        {
            folders.push_back(path + name + '/');
        }
        errno = 0;
    }
    if (folder != nullptr && errno != 0)
    {
        raiseUnreadState(path, errno);
    }
    return folders;
}

/// @param own the folder of the one to leave out
std::vector<WorkingTree> findLinkedBut(const std::string &own, const std::string &shared)
{
    std::vector<WorkingTree> trees;
    for (const std::string &state : foldersIn(shared + "worktrees/"))
    {
        if (!isSameFolder(state, own) && isLinked(state))
        {
            trees.emplace_back(state);
        }
    }
    return trees;
}

/// Returns true if the repository has no main working tree. A handle of a linked one does not know.
bool isBare(git_repository *repository)
{
    const auto config = acquire<git_config>(git_repository_config_snapshot, repository).value();
    return isSet(config.get(), "core.bare");
}

} // namespace

WorkingTree::WorkingTree(std::string state, bool isBare) : state_(std::move(state)), isBare_(isBare)
{
}

bool WorkingTree::isOn(const std::string &branch) const
{
    // git follows no more.
    constexpr int longestChain = 5;
    const std::string link = linkedHead();
    std::string name = link.empty() ? referenceIn(firstLineOf(state_ + "HEAD")) : link;
    for (int step = 1; name != branch && !name.empty() && step < longestChain; ++step)
    {
        name = symbolicTarget(folderOfBranches(state_) + name);
    }
    return name == branch;
}

std::string WorkingTree::linkedHead() const
{
    return linkedReference(state_ + "HEAD");
}

bool WorkingTree::hasCheckedOut(const std::string &branch) const
{
    return !isBare_ && isOn(branch);
}

bool WorkingTree::returnsTo(const std::string &branch) const
{
    static constexpr std::array<const char *, 3> files{"rebase-merge/head-name",
                                                       "rebase-apply/head-name", "BISECT_START"};
    return std::any_of(files.begin(), files.end(),
                       [&](const char *file)
                       {
                           const std::string line = firstLineOf(state_ + file);
                           // A bisection has the short name.
                           return !line.empty() &&
                                  (line == branch || "refs/heads/" + line == branch);
                       });
}

bool WorkingTree::moves(const std::string &branch) const
{
    // The others are the ids before and after.
    constexpr std::size_t linesOfOne = 3;
    const std::vector<std::string> lines = trimmedLinesOf(state_ + "rebase-merge/update-refs");
    for (std::size_t i = 0; i < lines.size(); i += linesOfOne)
    {
        if (lines[i] == branch)
        {
            return true;
        }
    }
    return false;
}

std::vector<WorkingTree> findLinkedWorkingTrees(const std::string &shared)
{
    return findLinkedBut(std::string(), shared);
}

std::vector<WorkingTree> findOtherWorkingTrees(git_repository *repository)
{
    const std::string own = git_repository_path(repository);
    const std::string shared = git_repository_commondir(repository);
    std::vector<WorkingTree> trees = findLinkedBut(own, shared);
    if (!isSameFolder(shared, own))
    {
        trees.emplace_back(shared, isBare(repository));
    }
    return trees;
}

bool isCheckedOutElsewhere(git_repository *repository, const std::string &branch)
{
    const std::vector<WorkingTree> others = findOtherWorkingTrees(repository);
    return std::any_of(others.begin(), others.end(),
                       [&branch](const WorkingTree &tree)
                       { return tree.hasCheckedOut(branch) || tree.returnsTo(branch); });
}

void refuseSwitchThroughLink(git_repository *repository)
{
    const std::string head = WorkingTree(git_repository_path(repository)).linkedHead();
    if (!head.empty())
    {
        raiseLinkedHead("switch branches", head);
    }
}

void refuseDeletionBehindLink(git_repository *repository, const std::string &branch)
{
    if (WorkingTree(git_repository_path(repository)).linkedHead() == branch)
    {
        raiseLinkedHead("delete '" + branch + "'", branch);
    }
}

void raiseUsedElsewhere(const std::string &action, const std::string &branch)
{
    raiseGitError(GIT_ERROR, GIT_ERROR_REFERENCE,
                  "cannot " + action + " '" + branch +
                      "', which another working tree has checked out, or needs for a rebase or "
                      "bisection: see git worktree list ('git worktree prune' forgets those whose "
                      "folders are gone)");
}

} // namespace vclink::git
