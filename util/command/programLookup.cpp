// SPDX-License-Identifier: MIT
#include "util/command/programLookup.hpp"

#include <cerrno>
#include <climits>
#include <cstdlib>
#include <vector>

#include <boost/algorithm/string/classification.hpp>
#include <boost/algorithm/string/split.hpp>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "util/command/commandLine.hpp"

namespace vclink::git
{
namespace
{

struct Program
{
    std::string path;
    /// An errno, or 0 for a program that was found.
    int error;
};

std::vector<std::string> split(const std::string &path)
{
    std::vector<std::string> folders;
    boost::split(folders, path, boost::is_any_of(":"));
    return folders;
}

/// The folders that execvpe searches if PATH is not set.
std::string defaultPath()
{
    std::string path(::confstr(_CS_PATH, nullptr, 0), '\0');
    ::confstr(_CS_PATH, path.data(), path.size());
    path.resize(path.find('\0'));
    return path;
}

/// Returns why the file cannot be executed, an errno, or 0 if it can.
int findObstacle(const std::string &file)
{
    struct stat status = {};
    if (::stat(file.c_str(), &status) != 0)
    {
        return errno;
    }
    if (!S_ISREG(status.st_mode))
    {
        return EACCES;
    }
    return ::faccessat(AT_FDCWD, file.c_str(), X_OK, AT_EACCESS) == 0 ? 0 : errno;
}

bool isSearchContinued(int error) noexcept
{
    return error == ENOENT || error == ENOTDIR || error == EACCES || error == ESTALE ||
           error == ENODEV || error == ETIMEDOUT;
}

Program searchAsExecvpe(const std::string &name, const std::vector<std::string> &folders)
{
    if (name.empty() || name.size() > NAME_MAX)
    {
        return {{}, name.empty() ? ENOENT : ENAMETOOLONG};
    }
    int result = ENOENT;
    for (const std::string &folder : folders)
    {
        // An empty element means the working folder.
        const std::string file = (folder.empty() ? "." : folder) + '/' + name;
        const int error = findObstacle(file);
        if (error == 0 || !isSearchContinued(error))
        {
            return {file, error};
        }
        result = error == EACCES ? EACCES : result;
    }
    return {{}, result};
}

/// Returns what Boost.Process finds for a name: anything that access(2) allows to execute, even a
/// folder. Boost.Process treats an empty element of PATH as the root.
std::string searchAsBoost(const std::string &name, const std::vector<std::string> &folders)
{
    std::string file = "./" + name;
    if (::access(name.c_str(), X_OK) == 0)
    {
        return file;
    }
    for (const std::string &folder : folders)
    {
        std::string candidate = folder + '/' + name;
        if (::access(candidate.c_str(), X_OK) == 0)
        {
            return candidate;
        }
    }
    return file;
}

/// Returns true if every release of Boost.Process finds this file.
bool isTakenByBoost(const std::string &file, const std::string &name,
                    std::vector<std::string> folders)
{
    if (searchAsBoost(name, folders) != file)
    {
        return false;
    }
    // Up to 1.77, Boost.Process splits the variable together with its name.
    folders.front().insert(0, "PATH=");
    return searchAsBoost(name, folders) == file;
}

std::error_code systemError(int error)
{
    return std::error_code(error, std::system_category());
}

} // namespace

std::string nameProgram(const std::string &command, std::error_code &error)
{
    const CommandWord word = findFirstWord(command);
    if (word.text.find('/') != std::string::npos)
    {
        return command;
    }
    const char *const path = std::getenv("PATH");
    const std::vector<std::string> folders = split(path != nullptr ? path : defaultPath());
    const Program program = searchAsExecvpe(word.text, folders);
    error = systemError(program.error);
    if (error || (path != nullptr && isTakenByBoost(program.path, word.text, folders)))
    {
        return command;
    }
    const bool isQuotable = program.path.find('"') == std::string::npos;
    error = systemError(isQuotable ? 0 : EINVAL);
    std::string named = command;
    // Every release since 1.74 removes the quotes.
    return named.replace(word.begin, word.size,
                         program.path.find(' ') == std::string::npos ? program.path
                                                                     : '"' + program.path + '"');
}

} // namespace vclink::git
