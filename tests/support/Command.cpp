// SPDX-License-Identifier: MIT
#include "support/Command.hpp"

#include <array>
#include <cerrno>
#include <csignal>
#include <stdexcept>
#include <system_error>
#include <utility>

#include <spawn.h>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

#include "support/Descriptor.hpp"
#include "support/processes.hpp"

namespace vclink::test
{
namespace
{

[[noreturn]] void raise(int error, const std::string &what)
{
    throw std::system_error(error, std::generic_category(), what);
}

/// A file in memory that a program is given as one of its standard streams.
class Stream
{
  public:
    explicit Stream(const std::string &bytes = {})
        : file_(Descriptor::checked(::memfd_create("stream", MFD_CLOEXEC), "memfd_create"))
    {
        for (std::size_t done = 0; done < bytes.size();)
        {
            const auto written = ::write(file_.get(), bytes.data() + done, bytes.size() - done);
            if (written < 0)
                raise(errno, "write");
            done += static_cast<std::size_t>(written);
        }
        ::lseek(file_.get(), 0, SEEK_SET);
    }
    int get() const noexcept
    {
        return file_.get();
    }
    std::string read() const
    {
        std::string bytes;
        std::array<char, 65536> block;
        for (;;)
        {
            const auto offset = static_cast<off_t>(bytes.size());
            const auto count = ::pread(file_.get(), block.data(), block.size(), offset);
            if (count < 0)
                raise(errno, "pread");
            if (count == 0)
                return bytes;
            bytes.append(block.data(), static_cast<std::size_t>(count));
        }
    }

  private:
    Descriptor file_;
};

/// What the child does between its birth and the program's start.
class FileActions
{
  public:
    FileActions()
    {
        ::posix_spawn_file_actions_init(&actions_);
    }
    FileActions(const FileActions &) = delete;
    FileActions &operator=(const FileActions &) = delete;
    ~FileActions()
    {
        ::posix_spawn_file_actions_destroy(&actions_);
    }
    void redirect(int standard, const Stream &stream)
    {
        ::posix_spawn_file_actions_adddup2(&actions_, stream.get(), standard);
    }
    void changeFolder(const std::filesystem::path &folder)
    {
        ::posix_spawn_file_actions_addchdir_np(&actions_, folder.c_str());
    }
    const posix_spawn_file_actions_t *get() const noexcept
    {
        return &actions_;
    }

  private:
    posix_spawn_file_actions_t actions_{};
};

/// A process group of its own, no blocked signal, and the signals' usual effect.
class Attributes
{
  public:
    Attributes()
    {
        ::posix_spawnattr_init(&attributes_);
        sigset_t signals;
        ::sigemptyset(&signals);
        ::posix_spawnattr_setsigmask(&attributes_, &signals);
        ::sigfillset(&signals);
        ::posix_spawnattr_setsigdefault(&attributes_, &signals);
        ::posix_spawnattr_setpgroup(&attributes_, 0);
        ::posix_spawnattr_setflags(&attributes_, POSIX_SPAWN_SETPGROUP | POSIX_SPAWN_SETSIGMASK |
                                                     POSIX_SPAWN_SETSIGDEF);
    }
    Attributes(const Attributes &) = delete;
    Attributes &operator=(const Attributes &) = delete;
    ~Attributes()
    {
        ::posix_spawnattr_destroy(&attributes_);
    }
    const posix_spawnattr_t *get() const noexcept
    {
        return &attributes_;
    }

  private:
    posix_spawnattr_t attributes_{};
};

} // namespace

Command::Command(std::vector<std::string> arguments) : arguments_(std::move(arguments))
{
}

Command &Command::in(std::filesystem::path folder)
{
    folder_ = std::move(folder);
    return *this;
}

Command &Command::environment(const std::string &name, std::string value)
{
    environment_[name] = std::move(value);
    return *this;
}

Command &Command::withoutEnvironment(const std::string &name)
{
    environment_[name].reset();
    return *this;
}

Command &Command::input(std::string bytes)
{
    input_ = std::move(bytes);
    return *this;
}

Command &Command::timeout(std::chrono::milliseconds time)
{
    timeout_ = time;
    return *this;
}

std::string Command::text() const
{
    std::string text;
    for (const auto &argument : arguments_)
        text += (text.empty() ? "" : " ") + argument;
    return text;
}

std::vector<std::string> Command::makeEnvironment() const
{
    std::vector<std::string> variables;
    for (char **variable = ::environ; variable != nullptr && *variable != nullptr; ++variable)
    {
        const std::string text = *variable;
        if (environment_.count(text.substr(0, text.find('='))) == 0)
            variables.push_back(text);
    }
    for (const auto &[name, value] : environment_)
    {
        if (value)
            variables.push_back(name + "=" + *value);
    }
    return variables;
}

CommandResult Command::run() const
{
    const Stream input(input_);
    const Stream output;
    const Stream errors;
    FileActions actions;
    actions.redirect(STDIN_FILENO, input);
    actions.redirect(STDOUT_FILENO, output);
    actions.redirect(STDERR_FILENO, errors);
    if (!folder_.empty())
        actions.changeFolder(folder_);

    auto arguments = arguments_;
    auto variables = makeEnvironment();
    pid_t process = 0;
    const int error =
        ::posix_spawnp(&process, arguments.at(0).c_str(), actions.get(), Attributes().get(),
                       makePointers(arguments).data(), makePointers(variables).data());
    if (error != 0)
        raise(error, text());

    CommandResult result;
    result.timedOut = !endsWithin(process, timeout_);
    if (result.timedOut)
        ::kill(-process, SIGKILL);
    const int status = collectStatus(process);
    if (WIFEXITED(status))
        result.exitStatus = WEXITSTATUS(status);
    else
        result.signal = WTERMSIG(status);
    result.output = output.read();
    result.errors = errors.read();
    return result;
}

std::string Command::runOrThrow() const
{
    CommandResult result = run();
    if (!result.succeeded())
    {
        throw std::runtime_error(text() + ": exit status " + std::to_string(result.exitStatus) +
                                 "\n" + result.errors);
    }
    return std::move(result.output);
}

} // namespace vclink::test
