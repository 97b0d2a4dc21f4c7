// SPDX-License-Identifier: MIT
#include "WorkingCopyMaker.hpp"

#include <fstream>
#include <sstream>

#include <fcntl.h>
#include <sys/stat.h>

#include "quoting.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

void dateBack(const fs::path &path)
{
    struct stat now = {};
    ::lstat(path.c_str(), &now);
    const timespec earlier{now.st_mtim.tv_sec - 3600, now.st_mtim.tv_nsec};
    const timespec times[] = {earlier, earlier};
    ::utimensat(AT_FDCWD, path.c_str(), times, AT_SYMLINK_NOFOLLOW);
}

} // namespace

WorkingCopyMaker::WorkingCopyMaker(const fs::path &folder)
    : repository_(GitRepository::init(folder))
{
}

void WorkingCopyMaker::note(const std::string &line)
{
    script_ += "  " + line + '\n';
}

void WorkingCopyMaker::noteAll(const std::string &verb, const std::vector<std::string> &paths)
{
    std::string line = verb;
    for (const auto &path : paths)
    {
        line += ' ' + quote(path);
    }
    note(line);
}

std::vector<std::string> WorkingCopyMaker::import(const std::vector<PlannedFile> &files,
                                                  const std::vector<std::string> &blobs)
{
    std::string stream;
    for (std::size_t i = 0; i < blobs.size(); ++i)
    {
        stream += "blob\nmark :" + std::to_string(i + 1) + '\n' + asFastImportData(blobs[i]);
        stream += "get-mark :" + std::to_string(i + 1) + '\n';
    }
    if (!files.empty())
    {
        stream += "commit refs/heads/main\ncommitter A <a@example.com> 1577836800 +0000\n";
        stream += asFastImportData("first");
    }
    for (const auto &file : files)
    {
        const bool submodule = file.mode == "160000";
        stream += "M " + file.mode + (submodule ? ' ' + file.content : std::string(" inline"));
        stream += ' ' + quote(file.path) + '\n' +
                  (submodule ? std::string() : asFastImportData(file.content));
        note("commit " + file.mode + ' ' + quote(file.path) + " with " + quote(file.content));
    }
    // Marks are answered on the standard output, a line each; the objects stay in one pack.
    const Command command = repository_
                                .command({"-c", "fastimport.unpackLimit=1", "fast-import",
                                          "--quiet", "--cat-blob-fd=1"})
                                .input(stream);
    std::istringstream lines(command.runOrThrow());
    std::vector<std::string> ids(blobs.size());
    for (auto &id : ids)
    {
        std::getline(lines, id);
    }
    return ids;
}

void WorkingCopyMaker::checkOut()
{
    repository_.git({"reset", "--quiet", "--hard"});
    note("git reset --hard");
}

void WorkingCopyMaker::write(const std::string &path, const std::string &bytes)
{
    if (isLink(path))
    {
        repository_.remove(path);
    }
    repository_.write(path, bytes);
    note("write " + quote(path) + " with " + quote(bytes));
}

void WorkingCopyMaker::link(const std::string &target, const std::string &path)
{
    if (exists(path))
    {
        repository_.remove(path);
    }
    repository_.symlink(target, path);
    note("link " + quote(path) + " to " + quote(target));
}

void WorkingCopyMaker::remove(const std::string &path)
{
    repository_.remove(path);
    note("remove " + quote(path));
}

void WorkingCopyMaker::setExecutable(const std::string &path, bool executable)
{
    repository_.setMode(path, executable ? 0755 : 0644);
    note(std::string("chmod ") + (executable ? "+x " : "-x ") + quote(path));
}

void WorkingCopyMaker::makeFolder(const std::string &path)
{
    repository_.makeFolder(path);
    note("make folder " + quote(path));
}

void WorkingCopyMaker::copyRepository(const fs::path &source, const std::string &path, bool gitFile)
{
    const fs::path folder = repository_ / path;
    fs::create_directories(folder.parent_path());
    fs::copy(source, folder, fs::copy_options::recursive);
    if (gitFile)
    {
        const fs::path modules = repository_ / ".git/modules";
        fs::create_directories(modules);
        const auto count = std::distance(fs::directory_iterator(modules), fs::directory_iterator());
        const fs::path moved = modules / std::to_string(count);
        fs::rename(folder / ".git", moved);
        std::ofstream(folder / ".git") << "gitdir: " << moved.string() << '\n';
        std::ofstream(moved / "config", std::ios::app)
            << "[core]\n\tworktree = " << quoteConfigValue(folder.string()) << '\n';
    }
    note(std::string("copy the other repository to ") + quote(path) +
         (gitFile ? ", with a .git file" : ""));
}

void WorkingCopyMaker::stage(const std::vector<std::string> &paths)
{
    noteAll("stage", paths);
    repository_.command({"update-index", "-z", "--add", "--remove", "--replace", "--stdin"})
        .input(joinWithNul(paths))
        .runOrThrow();
}

void WorkingCopyMaker::unstage(const std::vector<std::string> &paths)
{
    noteAll("git rm --cached", paths);
    repository_.command({"update-index", "-z", "--force-remove", "--stdin"})
        .input(joinWithNul(paths))
        .runOrThrow();
}

void WorkingCopyMaker::setIndex(const std::vector<IndexSide> &sides)
{
    std::string input;
    for (const auto &side : sides)
    {
        const std::string line =
            side.mode + ' ' + side.id + ' ' + std::to_string(side.stage) + '\t' + side.path;
        input += line + '\0';
        note("update-index --index-info " + quote(line));
    }
    repository_.command({"update-index", "-z", "--index-info"}).input(input).runOrThrow();
}

void WorkingCopyMaker::intendToAdd(const std::vector<std::string> &paths)
{
    noteAll("git add --intent-to-add", paths);
    repository_
        .command({"--literal-pathspecs", "add", "--intent-to-add", "--force",
                  "--pathspec-from-file=-", "--pathspec-file-nul"})
        .input(joinWithNul(paths))
        .runOrThrow();
}

void WorkingCopyMaker::settle()
{
    note("date all files back by an hour; git update-index --refresh");
    for (fs::recursive_directory_iterator entry(repository_.path()), end; entry != end; ++entry)
    {
        if (entry->path().filename() == ".git")
        {
            entry.disable_recursion_pending();
        }
        else if (entry->is_symlink() || !entry->is_directory())
        {
            dateBack(entry->path());
        }
    }
    // Its exit status only means that some entries differ.
    repository_.tryGit({"update-index", "-q", "--unmerged", "--ignore-missing", "--refresh"});
}

std::string WorkingCopyMaker::read(const std::string &path) const
{
    return repository_.read(path);
}

std::string WorkingCopyMaker::readLink(const std::string &path) const
{
    return fs::read_symlink(repository_ / path).string();
}

bool WorkingCopyMaker::canHold(const std::string &path) const
{
    for (std::size_t slash = path.find('/'); slash != std::string::npos;
         slash = path.find('/', slash + 1))
    {
        std::error_code missing;
        const auto type = fs::symlink_status(repository_ / path.substr(0, slash), missing).type();
        if (type == fs::file_type::not_found)
        {
            return true;
        }
        if (type != fs::file_type::directory)
        {
            return false;
        }
    }
    return true;
}

fs::file_type WorkingCopyMaker::typeOf(const std::string &path) const
{
    if (!canHold(path))
    {
        return fs::file_type::not_found;
    }
    std::error_code missing;
    return fs::symlink_status(repository_ / path, missing).type();
}

bool WorkingCopyMaker::isFile(const std::string &path) const
{
    return typeOf(path) == fs::file_type::regular;
}

bool WorkingCopyMaker::isLink(const std::string &path) const
{
    return typeOf(path) == fs::file_type::symlink;
}

bool WorkingCopyMaker::isFolder(const std::string &path) const
{
    return typeOf(path) == fs::file_type::directory;
}

bool WorkingCopyMaker::exists(const std::string &path) const
{
    return isFile(path) || isLink(path) || isFolder(path);
}

} // namespace vclink::test
