// SPDX-License-Identifier: MIT
#include "RefreshedIndex.hpp"

#include <cerrno>
#include <sstream>
#include <string>

#include <fcntl.h>
#include <git2.h>
#include <git2/sys/index.h>
#include <sys/stat.h>
#include <unistd.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/files/indexRefresh.hpp"
#include "main/files/stageChangedFiles.hpp"
#include "quoting.hpp"
#include "support/text.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::test
{
namespace
{

using git::acquire;
using git::check;

struct HiddenFile
{
    std::string path;
};

struct Opened
{
    explicit Opened(const GitRepository &repository)
        : handle(acquire<git_repository>(git_repository_open, repository.path().c_str()).value()),
          index(acquire<git_index>(git_repository_index, handle.get()).value())
    {
        check(git_index_read, index.get(), 1);
    }

    git::OwnedHandle<git_repository> handle;
    git::OwnedHandle<git_index> index;
};

std::string textOfHidden(const std::string &path)
{
    return "can't see " + quote(path);
}

std::string textOf(git_index *index)
{
    std::ostringstream lines;
    for (std::size_t i = 0; i < git_index_entrycount(index); ++i)
    {
        const git_index_entry &entry = *git_index_get_byindex(index, i);
        lines << quote(entry.path) << std::oct << ' ' << entry.mode << std::dec << ' '
              << git_oid_tostr_s(&entry.id) << ' ' << git_index_entry_stage(&entry) << " flags "
              << (entry.flags & GIT_INDEX_ENTRY_VALID) << ' '
              << (entry.flags_extended & GIT_INDEX_ENTRY_EXTENDED_FLAGS) << " size "
              << entry.file_size << " times " << entry.mtime.seconds << '.'
              << entry.mtime.nanoseconds << ' ' << entry.ctime.seconds << '.'
              << entry.ctime.nanoseconds << " inode " << entry.ino << '\n';
    }
    for (std::size_t i = 0; i < git_index_reuc_entrycount(index); ++i)
    {
        const git_index_reuc_entry &entry = *git_index_reuc_get_byindex(index, i);
        lines << "resolved " << quote(entry.path);
        for (int side = 0; side < 3; ++side)
        {
            lines << ' ' << std::oct << entry.mode[side] << std::dec << ' '
                  << (entry.mode[side] != 0 ? git_oid_tostr_s(&entry.oid[side]) : "-");
        }
        lines << '\n';
    }
    return lines.str();
}

/// Whether the file, or that it is gone, can't be seen by the user whose rights count.
bool isHidden(const GitRepository &repository, const std::string &path)
{
    struct stat status = {};
    if (::lstat((repository / path).c_str(), &status) != 0)
    {
        return errno != ENOENT && errno != ENOTDIR;
    }
    for (auto end = path.find('/'); end != std::string::npos; end = path.find('/', end + 1))
    {
        const std::string folder = repository / path.substr(0, end);
        if (::faccessat(AT_FDCWD, folder.c_str(), R_OK, AT_EACCESS) != 0)
        {
            return true;
        }
    }
    return false;
}

void putBackLeftOut(const GitRepository &repository, git_index *index)
{
    const Opened before(repository);
    for (std::size_t i = 0; i < git_index_entrycount(before.index.get()); ++i)
    {
        const git_index_entry *const entry = git_index_get_byindex(before.index.get(), i);
        std::size_t position = 0;
        if (git_index_find(&position, index, entry->path) == 0)
        {
            continue;
        }
        if ((entry->flags_extended & GIT_INDEX_ENTRY_SKIP_WORKTREE) != 0)
        {
            check(git_index_add, index, entry);
        }
        else if (isHidden(repository, entry->path))
        {
            throw HiddenFile{entry->path};
        }
    }
}

bool isBehindLink(const GitRepository &repository, const std::string &path)
{
    for (auto end = path.find('/'); end != std::string::npos; end = path.find('/', end + 1))
    {
        struct stat status = {};
        const std::string folder = repository / path.substr(0, end);
        if (::lstat(folder.c_str(), &status) == 0 && S_ISLNK(status.st_mode))
        {
            return true;
        }
    }
    return false;
}

/// git_index_update_all frees what it has not allocated when such a file is converted.
void addEmptied(const GitRepository &repository, git_index *index)
{
    git_oid empty;
    check(git_odb_hash, &empty, "", std::size_t{0}, GIT_OBJECT_BLOB);
    for (std::size_t i = 0; i < git_index_entrycount(index); ++i)
    {
        const git_index_entry entry = *git_index_get_byindex(index, i);
        const bool isLookedAt = git_index_entry_stage(&entry) == 0 &&
                                (entry.flags & GIT_INDEX_ENTRY_VALID) == 0 &&
                                (entry.flags_extended & GIT_INDEX_ENTRY_SKIP_WORKTREE) == 0;
        struct stat status = {};
        const bool isEmptied = ::lstat((repository / entry.path).c_str(), &status) == 0 &&
                               S_ISREG(status.st_mode) && status.st_size == 0;
        const bool isExecutable = (status.st_mode & S_IXUSR) != 0;
        const bool isAsNoted =
            git_oid_equal(&entry.id, &empty) != 0 &&
            entry.mode == (isExecutable ? GIT_FILEMODE_BLOB_EXECUTABLE : GIT_FILEMODE_BLOB);
        if (isLookedAt && isEmptied && !isAsNoted && !isBehindLink(repository, entry.path))
        {
            check(git_index_add_bypath, index, std::string(entry.path).c_str());
        }
    }
}

std::string textOf(const git::GitError &error)
{
    const std::string text = asUtf8(error.getMessage());
    const std::string name = "could not read '";
    if (text.compare(0, name.size(), name) == 0)
    {
        const auto end = text.find("', which is tracked");
        return textOfHidden(text.substr(name.size(), end - name.size()));
    }
    return std::to_string(error.getCode()) + ' ' + std::to_string(error.getErrorClass()) + ' ' +
           text;
}

} // namespace

std::string refreshByLibGit2(const GitRepository &repository)
{
    try
    {
        const Opened opened(repository);
        addEmptied(repository, opened.index.get());
        check(git_index_update_all, opened.index.get(), nullptr, nullptr, nullptr);
        putBackLeftOut(repository, opened.index.get());
        return textOf(opened.index.get());
    }
    catch (const HiddenFile &hidden)
    {
        return textOfHidden(hidden.path);
    }
    catch (const git::LibGit2Exception &exception)
    {
        return textOf(exception.getError());
    }
}

std::string refreshByLibrary(const GitRepository &repository)
{
    const Opened opened(repository);
    try
    {
        const git::ChangedFiles changed(opened.handle.get(), opened.index.get());
        git::HeldEntries held;
        const auto removed = git::stageChangedFiles(opened.handle.get(), opened.index.get(),
                                                    changed, changed.files(), held);
        git::refreshIndex(opened.handle.get(), opened.index.get(), changed, removed, held);
        return textOf(opened.index.get());
    }
    catch (const git::LibGit2Exception &exception)
    {
        return textOf(exception.getError());
    }
}

} // namespace vclink::test
