// SPDX-License-Identifier: MIT
#include "gitProgram.hpp"

#include <array>
#include <cerrno>
#include <system_error>
#include <utility>

#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include "texts.hpp"

namespace vclink::shell
{
namespace
{

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

/// Without git's own variables, which the library does not read, and the options of tar. Messages
/// are asked for in the program's language.
std::vector<std::string> environmentOfPrograms()
{
    std::vector<std::string> variables;
    for (char **variable = ::environ; *variable != nullptr; ++variable)
    {
        const std::string_view text = *variable;
        const bool isOfGit = text.substr(0, 4) == "GIT_" && text.substr(0, 11) != "GIT_CONFIG_";
        if (!isOfGit && text.substr(0, 12) != "TAR_OPTIONS=" && text.substr(0, 9) != "LANGUAGE=")
        {
            variables.emplace_back(text);
        }
    }
    variables.push_back("LANGUAGE=" + currentLanguage());
    return variables;
}

/// @return 0 or the system's error
int spawn(pid_t &child, std::vector<std::string> words, const std::array<int, 3> &descriptors)
{
    posix_spawn_file_actions_t actions;
    ::posix_spawn_file_actions_init(&actions);
    for (std::size_t index = 0; index < descriptors.size(); ++index)
    {
        ::posix_spawn_file_actions_adddup2(&actions, descriptors[index], static_cast<int>(index));
    }
    posix_spawnattr_t attributes;
    ::posix_spawnattr_init(&attributes);
    // A program that is stopped leaves half of what it writes.
    ::posix_spawnattr_setflags(&attributes, POSIX_SPAWN_SETPGROUP);
    std::vector<std::string> variables = environmentOfPrograms();
    const int error = ::posix_spawnp(&child, words.front().c_str(), &actions, &attributes,
                                     pointersTo(words).data(), pointersTo(variables).data());
    ::posix_spawnattr_destroy(&attributes);
    ::posix_spawn_file_actions_destroy(&actions);
    return error;
}

} // namespace

std::optional<std::string> runProgram(std::vector<std::string> words, const MemoryFile &in,
                                      const MemoryFile &out)
{
    const MemoryFile errors;
    if (!in.isComplete() || !out.isComplete() || !errors.isComplete())
    {
        return std::generic_category().message(ENOMEM);
    }
    const std::string name = words.front();
    pid_t child = 0;
    const std::array<int, 3> descriptors{in.descriptor(), out.descriptor(), errors.descriptor()};
    if (const int error = spawn(child, std::move(words), descriptors))
    {
        return name + ": " + std::generic_category().message(error);
    }
    int status = 0;
    while (::waitpid(child, &status, 0) < 0)
    {
        if (errno != EINTR)
        {
            return name + ": " + std::generic_category().message(errno);
        }
    }
    return status == 0 ? std::nullopt : std::optional(errors.read());
}

std::vector<std::string> gitWords(const std::filesystem::path &folder,
                                  const std::vector<std::string> &arguments)
{
    // No command of the user's configuration runs, and no line ending is a reason to fail.
    std::vector<std::string> words{"git",
                                   "-C",
                                   folder.string(),
                                   "-c",
                                   "core.hooksPath=/dev/null",
                                   "-c",
                                   "core.fsmonitor=false",
                                   "-c",
                                   "core.safecrlf=false"};
    words.insert(words.end(), arguments.begin(), arguments.end());
    return words;
}

std::optional<std::string> runGit(const std::filesystem::path &folder,
                                  const std::vector<std::string> &arguments, std::string_view input)
{
    const MemoryFile in(input);
    const MemoryFile out;
    const auto failure = runProgram(gitWords(folder, arguments), in, out);
    return failure ? std::nullopt : std::optional(out.read());
}

std::vector<std::string> splitAtNul(const std::string &text)
{
    std::vector<std::string> pieces;
    for (std::size_t start = 0; start < text.size();)
    {
        const std::size_t end = text.find('\0', start);
        pieces.push_back(text.substr(start, end - start));
        start = end == std::string::npos ? text.size() : end + 1;
    }
    return pieces;
}

std::map<std::string, std::string> readRemoteSettings(const std::filesystem::path &folder)
{
    std::map<std::string, std::string> settings;
    const std::string text =
        runGit(folder, {"config", "-z", "--get-regexp", "^(branch|remote)\\."}).value_or("");
    for (const std::string &entry : splitAtNul(text))
    {
        const std::size_t line = entry.find('\n');
        settings[entry.substr(0, line)] =
            line == std::string::npos ? std::string() : entry.substr(line + 1);
    }
    return settings;
}

} // namespace vclink::shell
