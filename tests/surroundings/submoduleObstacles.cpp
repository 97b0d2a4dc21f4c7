// SPDX-License-Identifier: MIT
#include "Situation.hpp"

#include <stdexcept>

#include <sys/stat.h>

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

const std::string mine = "the user's own work\n";

void leaveAsItIs(const GitRepository & /*copy*/, const std::string & /*path*/)
{
}

/// Has the submodule's repository in its own folder, as older releases of git and other programs
/// make it.
void embed(const GitRepository &copy, const std::string &path)
{
    copy.remove(path + "/.git");
    fs::rename(copy.gitFolder() / "modules" / path, copy / (path + "/.git"));
    copy.git({"config", "--file", path + "/.git/config", "--unset", "core.worktree"});
}

/// A commit that exists nowhere else.
void commitInside(const GitRepository &copy, const std::string &path)
{
    GitRepository submodule(copy / path);
    submodule.write("inner", mine);
    submodule.commitAll("mine");
}

void embedAndCommit(const GitRepository &copy, const std::string &path)
{
    embed(copy, path);
    commitInside(copy, path);
}

void emptyFolder(const GitRepository &copy, const std::string &path)
{
    copy.remove(path);
    copy.makeFolder(path);
}

void removeFolder(const GitRepository &copy, const std::string &path)
{
    copy.remove(path);
}

void editInside(const GitRepository &copy, const std::string &path)
{
    copy.write(path + "/inner", mine);
}

void addInside(const GitRepository &copy, const std::string &path)
{
    copy.write(path + "/untracked", mine);
}

void ignoreInside(const GitRepository &copy, const std::string &path)
{
    embed(copy, path);
    copy.write(path + "/.git/info/exclude", "ignored\n");
    copy.write(path + "/ignored", mine);
}

void move(const GitRepository &copy, const std::string &path)
{
    GitRepository(copy / path).git({"checkout", "--quiet", "origin/main"});
}

void moveAndStage(const GitRepository &copy, const std::string &path)
{
    commitInside(copy, path);
    copy.git({"add", path});
}

void makePlainFolder(const GitRepository &copy, const std::string &path)
{
    copy.remove(path);
    copy.write(path + "/precious", mine);
}

void replaceByFile(const GitRepository &copy, const std::string &path)
{
    copy.remove(path);
    copy.write(path, mine);
}

void replaceByLink(const GitRepository &copy, const std::string &path)
{
    copy.remove(path);
    copy.symlink("t", path);
}

void replaceByPipe(const GitRepository &copy, const std::string &path)
{
    copy.remove(path);
    if (::mkfifo((copy / path).c_str(), 0644) != 0)
        throw std::runtime_error("can't make a pipe");
}

void takeOut(const GitRepository &copy, const std::string &path)
{
    copy.git({"rm", "--quiet", "--cached", path});
}

void takeOutAndRemove(const GitRepository &copy, const std::string &path)
{
    takeOut(copy, path);
    copy.remove(path);
}

/// What a switch from a branch with a submodule leaves.
void leaveSubmodule(const GitRepository &copy, const std::string &path)
{
    fs::create_directories((copy / path).parent_path());
    fs::copy(copy.path().parent_path() / "source", copy / path, fs::copy_options::recursive);
}

void leaveSubmoduleWithCommit(const GitRepository &copy, const std::string &path)
{
    leaveSubmodule(copy, path);
    commitInside(copy, path);
}

void leaveIgnoredSubmodule(const GitRepository &copy, const std::string &path)
{
    leaveSubmodule(copy, path);
    copy.write((copy.sharedGitFolder() / "info/exclude").string(), '/' + path + '\n');
}

} // namespace

const std::vector<Obstacle> &submoduleObstacles()
{
    constexpr bool mayBlock = true;
    constexpr bool common = true;
    constexpr bool rare = false;
    constexpr auto nothing = Holds::Nothing;
    constexpr auto submodule = Holds::Submodule;
    static const std::vector<Obstacle> obstacles{
        {"clean submodule", submodule, common, leaveAsItIs},
        {"embedded repository", submodule, rare, embed},
        {"commit of its own", submodule, rare, commitInside},
        {"embedded repository with a commit of its own", submodule, common, embedAndCommit},
        {"not populated", submodule, common, emptyFolder},
        {"submodule missing", submodule, common, removeFolder},
        {"edit inside", submodule, rare, editInside},
        {"untracked file inside", submodule, rare, addInside},
        {"ignored file inside", submodule, rare, ignoreInside},
        {"another commit", submodule, common, move},
        {"another commit staged", submodule, rare, moveAndStage},
        {"plain folder", submodule, common, makePlainFolder},
        {"file in the submodule's place", submodule, rare, replaceByFile},
        {"link in the submodule's place", submodule, rare, replaceByLink},
        {"pipe in the submodule's place", submodule, rare, replaceByPipe, mayBlock},
        {"taken out of the index", submodule, common, takeOut},
        {"taken out and removed", submodule, rare, takeOutAndRemove},
        {"left submodule", nothing, common, leaveSubmodule},
        {"left submodule with a commit of its own", nothing, common, leaveSubmoduleWithCommit},
        {"left submodule, ignored", nothing, rare, leaveIgnoredSubmodule},
    };
    return obstacles;
}

} // namespace vclink::test
