// SPDX-License-Identifier: MIT
#include "support/GitRepository.hpp"

#include <fstream>
#include <iterator>
#include <stdexcept>
#include <utility>

namespace vclink::test
{
namespace
{

std::string runOrThrow(const Command &command)
{
    auto result = command.run();
    if (!result.succeeded())
    {
        throw std::runtime_error(command.text() + ": exit status " +
                                 std::to_string(result.exitStatus) + "\n" + result.errors);
    }
    return std::move(result.output);
}

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

} // namespace

GitRepository GitRepository::init(const std::filesystem::path &folder)
{
    runOrThrow(
        makeCommand({"init", "--quiet", "--template=", "--initial-branch=main", folder.string()}));
    return GitRepository(folder);
}

GitRepository GitRepository::clone(const std::filesystem::path &source,
                                   const std::filesystem::path &folder)
{
    runOrThrow(makeCommand({"clone", "--quiet", "--template=", source.string(), folder.string()}));
    return GitRepository(folder);
}

GitRepository::GitRepository(std::filesystem::path folder) : path_(std::move(folder))
{
}

void GitRepository::write(const std::string &name, const std::string &bytes) const
{
    const auto file = path_ / name;
    std::filesystem::create_directories(file.parent_path());
    std::ofstream stream(file, std::ios::binary | std::ios::trunc);
    stream << bytes << std::flush;
    if (!stream)
        throw std::runtime_error("can't write " + file.string());
}

std::string GitRepository::read(const std::string &name) const
{
    std::ifstream stream(path_ / name, std::ios::binary);
    if (!stream)
        throw std::runtime_error("can't read " + (path_ / name).string());
    return {std::istreambuf_iterator<char>(stream), {}};
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
    runOrThrow(command({"-c", "user.name=Test Author", "-c", "user.email=author@example.com",
                        "commit", "--quiet", "--allow-empty", "--allow-empty-message",
                        "--no-verify", "--message", message})
                   .environment("GIT_AUTHOR_DATE", date)
                   .environment("GIT_COMMITTER_DATE", date));
    return line({"rev-parse", "HEAD"});
}

std::string GitRepository::commitAll(const std::string &message)
{
    add();
    return commit(message);
}

std::string GitRepository::git(const std::vector<std::string> &arguments) const
{
    return runOrThrow(command(arguments));
}

std::string GitRepository::line(const std::vector<std::string> &arguments) const
{
    auto text = git(arguments);
    if (!text.empty() && text.back() == '\n')
        text.pop_back();
    return text;
}

CommandResult GitRepository::tryGit(const std::vector<std::string> &arguments) const
{
    return command(arguments).run();
}

Command GitRepository::command(const std::vector<std::string> &arguments) const
{
    return makeCommand(arguments).in(path_);
}

} // namespace vclink::test
