// SPDX-License-Identifier: MIT
#include "support/GitRepository.hpp"

#include <fstream>
#include <map>
#include <sstream>
#include <stdexcept>
#include <utility>

#include "support/TemporaryFolder.hpp"

namespace vclink::test
{
namespace
{

Command makeCommand(const std::vector<std::string> &arguments)
{
    // No maintenance process outlives the command, and local submodules may be cloned.
    std::vector<std::string> all{"git",
                                 "-c",
                                 "gc.auto=0",
                                 "-c",
                                 "maintenance.auto=false",
                                 "-c",
                                 "protocol.file.allow=always"};
    all.insert(all.end(), arguments.begin(), arguments.end());
    return Command(std::move(all));
}

std::string readOrThrow(const std::filesystem::path &file)
{
    std::ifstream stream(file, std::ios::binary);
    if (!stream)
        throw std::runtime_error("can't read " + file.string());
    std::ostringstream content;
    content << stream.rdbuf();
    // A folder opens, but cannot be read.
    if (content.bad())
        throw std::runtime_error("can't read " + file.string());
    return content.str();
}

void writeFile(const std::filesystem::path &file, const std::string &bytes)
{
    std::ofstream stream(file, std::ios::binary | std::ios::trunc);
    stream << bytes << std::flush;
    if (!stream)
        throw std::runtime_error("can't write " + file.string());
}

std::string withoutLineFeed(std::string text)
{
    if (!text.empty() && text.back() == '\n')
        text.pop_back();
    return text;
}

/// The folders and files that git makes of a new repository.
struct NewRepository
{
    std::vector<std::filesystem::path> folders;
    std::map<std::filesystem::path, std::string> files;
};

NewRepository askGitForNewRepository()
{
    namespace fs = std::filesystem;
    const TemporaryFolder folder;
    makeCommand({"init", "--quiet", "--template=", "--initial-branch=main", "."})
        .in(folder.path())
        .environment("HOME", folder.path())
        .environment("XDG_CONFIG_HOME", folder.path())
        .runOrThrow();
    NewRepository made;
    for (const auto &entry : fs::recursive_directory_iterator(folder.path()))
    {
        const auto name = entry.path().lexically_relative(folder.path());
        if (entry.is_directory())
            made.folders.push_back(name);
        else
            made.files.emplace(name, readOrThrow(entry.path()));
    }
    return made;
}

/// The id of the new commit at HEAD. Its reference is not packed yet: it has its own file.
std::string idOfNewCommit(const GitRepository &repository)
{
    const std::string beginning = "ref: ";
    const auto folder = repository / ".git";
    if (!std::filesystem::is_directory(folder))
        return repository.line({"rev-parse", "HEAD"});
    std::string text = withoutLineFeed(readOrThrow(folder / "HEAD"));
    if (text.compare(0, beginning.size(), beginning) == 0)
        text = withoutLineFeed(readOrThrow(folder / text.substr(beginning.size())));
    return text;
}

} // namespace

GitRepository GitRepository::init(const std::filesystem::path &folder)
{
    // Starting git takes many times as long as writing these few files.
    static const NewRepository made = askGitForNewRepository();
    if (std::filesystem::exists(folder / ".git"))
        throw std::runtime_error("a repository is there already: " + folder.string());
    std::filesystem::create_directories(folder);
    for (const auto &name : made.folders)
        std::filesystem::create_directory(folder / name);
    for (const auto &[name, bytes] : made.files)
        writeFile(folder / name, bytes);
    return GitRepository(folder);
}

GitRepository GitRepository::clone(const std::filesystem::path &source,
                                   const std::filesystem::path &folder)
{
    makeCommand({"clone", "--quiet", "--template=", source.string(), folder.string()}).runOrThrow();
    return GitRepository(folder);
}

GitRepository::GitRepository(std::filesystem::path folder) : path_(std::move(folder))
{
}

GitRepository GitRepository::copyTo(const std::filesystem::path &folder) const
{
    namespace fs = std::filesystem;
    fs::remove_all(folder);
    fs::copy(path_, folder, fs::copy_options::recursive | fs::copy_options::copy_symlinks);
    return GitRepository(folder);
}

void GitRepository::write(const std::string &name, const std::string &bytes) const
{
    const auto file = path_ / name;
    std::filesystem::create_directories(file.parent_path());
    writeFile(file, bytes);
}

std::filesystem::path GitRepository::gitFolder() const
{
    const std::string beginning = "gitdir: ";
    const auto folder = path_ / ".git";
    if (std::filesystem::is_directory(folder))
        return folder;
    if (!std::filesystem::exists(folder) && std::filesystem::exists(path_ / "objects"))
        return path_;
    const std::string text = withoutLineFeed(readOrThrow(folder));
    if (text.compare(0, beginning.size(), beginning) != 0)
        throw std::runtime_error("no git folder in " + path_.string());
    return (path_ / text.substr(beginning.size())).lexically_normal();
}

std::filesystem::path GitRepository::sharedGitFolder() const
{
    const auto own = gitFolder();
    if (!std::filesystem::exists(own / "commondir"))
        return own;
    return (own / withoutLineFeed(readOrThrow(own / "commondir"))).lexically_normal();
}

std::string GitRepository::read(const std::string &name) const
{
    return readOrThrow(path_ / name);
}

void GitRepository::makeFolder(const std::string &name) const
{
    std::filesystem::create_directories(path_ / name);
}

void GitRepository::remove(const std::string &name) const
{
    if (std::filesystem::remove_all(path_ / name) == 0)
        throw std::runtime_error("nothing to remove at " + (path_ / name).string());
}

void GitRepository::symlink(const std::string &target, const std::string &name) const
{
    const auto link = path_ / name;
    std::filesystem::create_directories(link.parent_path());
    std::filesystem::create_symlink(target, link);
}

void GitRepository::setMode(const std::string &name, unsigned mode) const
{
    std::filesystem::permissions(path_ / name, std::filesystem::perms(mode));
}

void GitRepository::identify(const std::string &name, const std::string &email) const
{
    std::ofstream configuration(sharedGitFolder() / "config", std::ios::app);
    configuration << "[user]\n\tname = " << name << "\n\temail = " << email << '\n' << std::flush;
    if (!configuration)
        throw std::runtime_error("can't write the configuration in " + path_.string());
}

void GitRepository::add(const std::vector<std::string> &names) const
{
    if (names.empty())
    {
        git({"add", "--all"});
        return;
    }
    std::vector<std::string> arguments{"--literal-pathspecs", "add", "--all", "--force", "--"};
    arguments.insert(arguments.end(), names.begin(), names.end());
    git(arguments);
}

std::string GitRepository::commit(const std::string &message)
{
    const std::string date = std::to_string(1'577'836'800 + 60 * commits_++) + " +0000";
    command({"-c", "user.name=Test Author", "-c", "user.email=author@example.com", "commit",
             "--quiet", "--allow-empty", "--allow-empty-message", "--no-verify", "--message",
             message})
        .environment("GIT_AUTHOR_DATE", date)
        .environment("GIT_COMMITTER_DATE", date)
        .runOrThrow();
    return idOfNewCommit(*this);
}

std::string GitRepository::commitAll(const std::string &message)
{
    add();
    return commit(message);
}

std::string GitRepository::commitAll(const std::function<void(const GitRepository &)> &change,
                                     const std::string &message)
{
    change(*this);
    return commitAll(message);
}

void GitRepository::makeBranch(const std::string &name,
                               const std::function<void(const GitRepository &)> &change,
                               const std::string &start)
{
    git({"checkout", "--quiet", "-b", name, start});
    commitAll(change, "on " + name);
    git({"checkout", "--quiet", "main"});
}

std::string GitRepository::git(const std::vector<std::string> &arguments) const
{
    return command(arguments).runOrThrow();
}

std::string GitRepository::line(const std::vector<std::string> &arguments) const
{
    return withoutLineFeed(git(arguments));
}

CommandResult GitRepository::tryGit(const std::vector<std::string> &arguments) const
{
    return command(arguments).run();
}

CommandResult GitRepository::check() const
{
    // For each of these two kinds of files, which the library never writes, git would start a
    // process, even if there is none.
    return tryGit({"-c", "core.commitGraph=false", "-c", "core.multiPackIndex=false", "fsck",
                   "--strict", "--no-dangling", "--no-progress"});
}

Command GitRepository::command(const std::vector<std::string> &arguments) const
{
    return makeCommand(arguments).in(path_);
}

} // namespace vclink::test
