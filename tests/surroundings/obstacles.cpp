// SPDX-License-Identifier: MIT
#include "Situation.hpp"

#include <cstdint>
#include <fstream>
#include <functional>
#include <stdexcept>

#include <git2.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include "error/errorUtil/GitResult.hpp"
#include "support/WorkingFolder.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;
using git::acquire;

using Put = std::function<void(const GitRepository &copy, const std::string &path)>;

const std::string ownWork = "the user's own work\n";

void require(bool isDone, const std::string &what)
{
    if (!isDone)
        throw std::runtime_error("can't " + what);
}

void clear(const GitRepository &copy, const std::string &path)
{
    fs::remove_all(copy / path);
    fs::create_directories((copy / path).parent_path());
}

void append(const fs::path &file, const std::string &line)
{
    fs::create_directories(file.parent_path());
    std::ofstream(file, std::ios::app) << line << '\n';
}

void write(const GitRepository &copy, const std::string &path)
{
    copy.write(path, ownWork);
}

void replace(const GitRepository &copy, const std::string &path)
{
    clear(copy, path);
    copy.write(path, ownWork);
}

/// A link to something in the folder "outside", or to nothing.
Put linkTo(const std::string &target)
{
    return [target](const GitRepository &copy, const std::string &path)
    {
        clear(copy, path);
        const fs::path place = copy / path;
        const fs::path absolute = copy.path().parent_path() / target;
        fs::create_symlink(absolute.lexically_relative(place.parent_path()), place);
    };
}

void makePipe(const GitRepository &copy, const std::string &path)
{
    clear(copy, path);
    require(::mkfifo((copy / path).c_str(), 0644) == 0, "make a pipe");
}

void makeSocket(const GitRepository &copy, const std::string &path)
{
    clear(copy, path);
    const WorkingFolder here((copy / path).parent_path());
    sockaddr_un address{AF_UNIX, {}};
    fs::path(path).filename().string().copy(address.sun_path, sizeof address.sun_path - 1);
    const int end = ::socket(AF_UNIX, SOCK_STREAM, 0);
    require(::bind(end, reinterpret_cast<const sockaddr *>(&address), sizeof address) == 0,
            "make a socket");
    ::close(end);
}

void makeFolder(const GitRepository &copy, const std::string &path)
{
    clear(copy, path);
    copy.write(path + "/inner", ownWork);
    copy.write(path + "/deeper/inner", ownWork + "deeper\n");
}

void makeEmptyFolder(const GitRepository &copy, const std::string &path)
{
    clear(copy, path);
    copy.makeFolder(path);
}

void makeRepository(const GitRepository &copy, const std::string &path)
{
    makeFolder(copy, path);
    copy.write(path + "/.git/HEAD", "ref: refs/heads/main\n");
    copy.write(path + "/.git/config", "[core]\n\trepositoryformatversion = 0\n");
    copy.makeFolder(path + "/.git/objects");
    copy.makeFolder(path + "/.git/refs");
}

void ignore(const GitRepository &copy, const std::string &path)
{
    append(copy.sharedGitFolder() / "info/exclude", '/' + path);
}

Put ignored(const Put &make, const std::string &below = "")
{
    return [=](const GitRepository &copy, const std::string &path)
    {
        make(copy, path);
        ignore(copy, path + below);
    };
}

/// The index of a working copy, written when it was changed.
void changeIndex(const GitRepository &copy, const std::function<int(git_index *index)> &change)
{
    const auto repository = acquire<git_repository>(git_repository_open, copy.path().c_str());
    const auto index = acquire<git_index>(git_repository_index, repository.value().get()).value();
    require(change(index.get()) == 0 && git_index_write(index.get()) == 0, "change the index");
}

void stage(const GitRepository &copy, const std::string &path)
{
    const bool isThere = fs::exists(fs::symlink_status(copy / path));
    changeIndex(copy,
                [&](git_index *index)
                {
                    return isThere ? git_index_add_bypath(index, path.c_str())
                                   : git_index_remove_bypath(index, path.c_str());
                });
}

void stageText(const GitRepository &copy, const std::string &path)
{
    write(copy, path);
    stage(copy, path);
}

void stageAndEdit(const GitRepository &copy, const std::string &path)
{
    stageText(copy, path);
    copy.write(path, ownWork + "edited\n");
}

void removeFile(const GitRepository &copy, const std::string &path)
{
    fs::remove_all(copy / path);
}

void stageRemoval(const GitRepository &copy, const std::string &path)
{
    removeFile(copy, path);
    stage(copy, path);
}

void unstage(const GitRepository &copy, const std::string &path)
{
    changeIndex(copy,
                [&](git_index *index) { return git_index_remove_bypath(index, path.c_str()); });
}

void makeExecutable(const GitRepository &copy, const std::string &path)
{
    copy.setMode(path, 0755);
}

void stageExecutable(const GitRepository &copy, const std::string &path)
{
    makeExecutable(copy, path);
    stage(copy, path);
}

void mark(const GitRepository &copy, const std::string &path, std::uint16_t flags,
          std::uint16_t extended)
{
    changeIndex(copy,
                [&](git_index *index)
                {
                    git_index_entry entry = *git_index_get_bypath(index, path.c_str(), 0);
                    entry.path = path.c_str();
                    entry.flags = static_cast<std::uint16_t>(entry.flags | flags);
                    entry.flags_extended =
                        static_cast<std::uint16_t>(entry.flags_extended | extended);
                    return git_index_add(index, &entry);
                });
}

void leaveOut(const GitRepository &copy, const std::string &path)
{
    append(copy.sharedGitFolder() / "config", "[core]\n\tsparseCheckout = true");
    append(copy.gitFolder() / "info/sparse-checkout", "/*\n!/" + path);
    mark(copy, path, 0, GIT_INDEX_ENTRY_SKIP_WORKTREE);
}

Put leftOut(void (*change)(const GitRepository &copy, const std::string &path))
{
    return [change](const GitRepository &copy, const std::string &path)
    {
        leaveOut(copy, path);
        change(copy, path);
    };
}

void assumeUnchanged(const GitRepository &copy, const std::string &path)
{
    mark(copy, path, GIT_INDEX_ENTRY_VALID, 0);
    write(copy, path);
}

} // namespace

const std::vector<Obstacle> &allObstacles()
{
    constexpr bool mayBlock = true;
    constexpr bool common = true;
    constexpr bool rare = false;
    constexpr auto nothing = Holds::Nothing;
    constexpr auto file = Holds::File;
    constexpr auto folder = Holds::Folder;
    static const std::vector<Obstacle> obstacles{
        {"untracked file", nothing, common, write},
        {"ignored file", nothing, common, ignored(write)},
        {"link to nothing", nothing, rare, linkTo("missing")},
        {"link to a file", nothing, rare, linkTo("outside/file")},
        {"link to a folder", nothing, common, linkTo("outside")},
        {"ignored link", nothing, rare, ignored(linkTo("outside/file"))},
        {"pipe", nothing, common, makePipe, mayBlock},
        {"socket", nothing, rare, makeSocket},
        {"untracked folder", nothing, common, makeFolder},
        {"empty folder", nothing, rare, makeEmptyFolder},
        {"ignored folder", nothing, rare, ignored(makeFolder)},
        {"folder with ignored files", nothing, rare, ignored(makeFolder, "/*")},
        {"repository", nothing, rare, makeRepository},
        {"staged new file", nothing, common, stageText},
        {"staged and edited new file", nothing, rare, stageAndEdit},
        {"edit", file, common, write},
        {"staged edit", file, common, stageText},
        {"staged and edited", file, rare, stageAndEdit},
        {"missing", file, common, removeFile},
        {"staged deletion", file, rare, stageRemoval},
        {"not tracked any more", file, rare, unstage},
        {"executable", file, common, makeExecutable},
        {"staged executable", file, rare, stageExecutable},
        {"link in its place", file, rare, linkTo("outside/file")},
        {"pipe in its place", file, common, makePipe, mayBlock},
        {"socket in its place", file, rare, makeSocket},
        {"folder in its place", file, common, makeFolder},
        {"empty folder in its place", file, rare, makeEmptyFolder},
        {"left out and edited", file, common, leftOut(write)},
        {"left out and missing", file, rare, leftOut(removeFile)},
        {"assumed unchanged and edited", file, rare, assumeUnchanged},
        {"file in the folder's place", folder, common, replace},
        {"link in the folder's place", folder, common, linkTo("outside")},
        {"link to nothing in the folder's place", folder, rare, linkTo("missing")},
        {"pipe in the folder's place", folder, rare, makePipe, mayBlock},
        {"folder missing", folder, common, removeFile},
        {"folder emptied", folder, rare, makeEmptyFolder},
    };
    return obstacles;
}

} // namespace vclink::test
