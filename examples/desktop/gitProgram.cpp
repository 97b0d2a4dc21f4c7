// SPDX-License-Identifier: MIT
#include "gitProgram.hpp"

#include <cstdlib>
#include <string_view>
#include <utility>
#include <vector>

#include <QSysInfo>
#include <spawn.h>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

#include "hostTools.hpp"
#include "text.hpp"

namespace vclink::desktop
{
namespace
{

/// A file in memory.
class Memory
{
  public:
    explicit Memory(std::string_view bytes = {}) : number_(::memfd_create("git", MFD_CLOEXEC))
    {
        isComplete_ =
            ::pwrite(number_, bytes.data(), bytes.size(), 0) == static_cast<ssize_t>(bytes.size());
    }
    Memory(const Memory &) = delete;
    Memory &operator=(const Memory &) = delete;
    ~Memory()
    {
        ::close(number_);
    }
    int number() const noexcept
    {
        return number_;
    }
    bool isComplete() const noexcept
    {
        return isComplete_;
    }
    std::string read() const
    {
        std::string bytes(static_cast<std::size_t>(::lseek(number_, 0, SEEK_END)), '\0');
        const ssize_t count = ::pread(number_, bytes.data(), bytes.size(), 0);
        bytes.resize(count < 0 ? 0 : static_cast<std::size_t>(count));
        return bytes;
    }

  private:
    int number_;
    bool isComplete_ = false;
};

/// Without git's own variables, which the library does not read.
std::vector<char *> environmentOfGit()
{
    std::vector<char *> variables;
    for (char **variable = ::environ; *variable != nullptr; ++variable)
    {
        if (std::string_view(*variable).substr(0, 4) != "GIT_")
            variables.push_back(*variable);
    }
    variables.push_back(nullptr);
    return variables;
}

/// Names are bytes, which QProcess would not keep.
/// @return what git wrote; nothing if it failed
std::optional<std::string> runGit(const upath &root, std::vector<std::string> arguments,
                                  std::string_view input = {})
{
    const std::string folder = host_tools::toStdPath(root).string();
    arguments.insert(arguments.begin(), {"git", "-C", folder});
    std::vector<char *> pointers;
    pointers.reserve(arguments.size() + 1);
    for (auto &argument : arguments)
        pointers.push_back(argument.data());
    pointers.push_back(nullptr);
    const Memory in(input);
    const Memory out;
    posix_spawn_file_actions_t actions;
    ::posix_spawn_file_actions_init(&actions);
    ::posix_spawn_file_actions_adddup2(&actions, in.number(), STDIN_FILENO);
    ::posix_spawn_file_actions_adddup2(&actions, out.number(), STDOUT_FILENO);
    pid_t child = 0;
    const int error = ::posix_spawnp(&child, "git", &actions, nullptr, pointers.data(),
                                     environmentOfGit().data());
    ::posix_spawn_file_actions_destroy(&actions);
    int status = 0;
    const bool ran = in.isComplete() && error == 0 && ::waitpid(child, &status, 0) == child;
    return ran && status == 0 ? std::optional(out.read()) : std::nullopt;
}

std::string setting(const upath &root, const char *key)
{
    std::string value = runGit(root, {"config", "--get", key}).value_or("");
    if (!value.empty() && value.back() == '\n')
        value.pop_back();
    return value;
}

/// Takes the next answer of "git cat-file --batch" off: "ID blob SIZE", the bytes, and a line feed.
std::optional<std::string> takeAnswer(std::string_view &answers)
{
    const std::size_t end = answers.find('\n');
    const std::string line(answers.substr(0, end));
    answers.remove_prefix(end == std::string_view::npos ? answers.size() : end + 1);
    const std::size_t mark = line.find(" blob ");
    if (mark == std::string::npos)
        return std::nullopt;
    const std::size_t size = std::strtoull(line.c_str() + mark + 6, nullptr, 10);
    std::string bytes(answers.substr(0, size));
    answers.remove_prefix(std::min(answers.size(), size + 1));
    return bytes;
}

} // namespace

QString findAuthor(const upath &root)
{
    const std::string name = setting(root, "user.name");
    const std::string address = setting(root, "user.email");
    if (!name.empty() && !address.empty())
        return fromUtf8(name + " <" + address + '>');
    const char *user = std::getenv("USER");
    if (user == nullptr)
        user = std::getenv("LOGNAME");
    return user == nullptr ? QString()
                           : fromUtf8(std::string(user) + " <" + user + '@') +
                                 QSysInfo::machineHostName() + u'>';
}

Sides readSides(const upath &root, const upath &file)
{
    const std::string name = fl::i18n::ustring_to_utf8(host_tools::relativeName(file, root));
    std::string questions;
    for (const char *side : {":1:", ":2:", ":3:"})
        questions += side + name + '\0';
    const std::string answers = runGit(root, {"cat-file", "--batch", "-z"}, questions).value_or("");
    std::string_view rest = answers;
    Sides sides;
    for (auto *side : {&sides.ancestor, &sides.ours, &sides.theirs})
        *side = takeAnswer(rest);
    return sides;
}

} // namespace vclink::desktop
