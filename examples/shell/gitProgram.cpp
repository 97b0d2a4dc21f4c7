// SPDX-License-Identifier: MIT
#include "gitProgram.hpp"

#include <cerrno>
#include <utility>

#include <fcntl.h>
#include <spawn.h>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

namespace vclink::shell
{
namespace
{

/// A file in memory, for what a program reads or writes.
class Memory
{
  public:
    explicit Memory(std::string_view bytes = {}) : number_(::memfd_create("git", MFD_CLOEXEC))
    {
        while (!bytes.empty() && number_ >= 0)
        {
            const ssize_t written = ::write(number_, bytes.data(), bytes.size());
            if (written < 0 && errno != EINTR)
            {
                isComplete_ = false;
                return;
            }
            bytes.remove_prefix(written < 0 ? 0 : static_cast<std::size_t>(written));
        }
        isComplete_ = number_ >= 0 && ::lseek(number_, 0, SEEK_SET) == 0;
    }
    Memory(const Memory &) = delete;
    Memory &operator=(const Memory &) = delete;
    ~Memory()
    {
        if (number_ >= 0)
        {
            ::close(number_);
        }
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
        const off_t size = ::lseek(number_, 0, SEEK_END);
        std::string bytes(size < 0 ? 0 : static_cast<std::size_t>(size), '\0');
        std::size_t done = 0;
        while (done < bytes.size())
        {
            const ssize_t count = ::pread(number_, bytes.data() + done, bytes.size() - done,
                                          static_cast<off_t>(done));
            if (count <= 0)
            {
                break;
            }
            done += static_cast<std::size_t>(count);
        }
        bytes.resize(done);
        return bytes;
    }

  private:
    int number_;
    bool isComplete_ = false;
};

std::vector<char *> pointersTo(std::vector<std::string> &texts)
{
    std::vector<char *> pointers;
    pointers.reserve(texts.size() + 1);
    for (std::string &text : texts)
    {
        pointers.push_back(text.data());
    }
    pointers.push_back(nullptr);
    return pointers;
}

/// Without git's own variables, which the library does not read.
std::vector<std::string> environmentOfGit(const std::vector<std::string> &added)
{
    std::vector<std::string> variables = added;
    for (char **variable = ::environ; *variable != nullptr; ++variable)
    {
        const std::string_view text = *variable;
        if (text.substr(0, 4) != "GIT_" || text.substr(0, 11) == "GIT_CONFIG_")
        {
            variables.emplace_back(text);
        }
    }
    return variables;
}

/// @return whether the program has ended with status 0
bool run(std::vector<std::string> words, std::vector<std::string> variables, const Memory &in,
         const Memory &out)
{
    posix_spawn_file_actions_t actions;
    ::posix_spawn_file_actions_init(&actions);
    ::posix_spawn_file_actions_adddup2(&actions, in.number(), STDIN_FILENO);
    ::posix_spawn_file_actions_adddup2(&actions, out.number(), STDOUT_FILENO);
    ::posix_spawn_file_actions_addopen(&actions, STDERR_FILENO, "/dev/null", O_WRONLY, 0);
    pid_t child = 0;
    const int error = ::posix_spawnp(&child, "git", &actions, nullptr, pointersTo(words).data(),
                                     pointersTo(variables).data());
    ::posix_spawn_file_actions_destroy(&actions);
    if (error != 0)
    {
        return false;
    }
    int status = 0;
    while (::waitpid(child, &status, 0) < 0)
    {
        if (errno != EINTR)
        {
            return false;
        }
    }
    return status == 0;
}

} // namespace

std::optional<std::string> runGit(const std::filesystem::path &folder,
                                  std::vector<std::string> arguments, std::string_view input,
                                  const std::vector<std::string> &variables)
{
    // Nothing of the user's runs meanwhile, and no line ending is a reason to fail.
    arguments.insert(arguments.begin(),
                     {"git", "-C", folder.string(), "-c", "core.hooksPath=/dev/null", "-c",
                      "core.fsmonitor=false", "-c", "core.safecrlf=false"});
    const Memory in(input);
    const Memory out;
    const bool succeeded = in.isComplete() && out.isComplete() &&
                           run(std::move(arguments), environmentOfGit(variables), in, out);
    return succeeded ? std::optional(out.read()) : std::nullopt;
}

std::map<std::string, std::string> readRemoteSettings(const std::filesystem::path &folder)
{
    std::map<std::string, std::string> settings;
    const std::string text =
        runGit(folder, {"config", "-z", "--get-regexp", "^(branch|remote)\\."}).value_or("");
    for (std::size_t start = 0; start < text.size();)
    {
        const std::size_t end = text.find('\0', start);
        const std::string entry = text.substr(start, end - start);
        const std::size_t line = entry.find('\n');
        settings[entry.substr(0, line)] =
            line == std::string::npos ? std::string() : entry.substr(line + 1);
        start = end == std::string::npos ? text.size() : end + 1;
    }
    return settings;
}

} // namespace vclink::shell
