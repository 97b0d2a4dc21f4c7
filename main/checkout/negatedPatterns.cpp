// SPDX-License-Identifier: MIT
#include "main/checkout/negatedPatterns.hpp"

#include <cstddef>
#include <cstdlib>
#include <memory>
#include <sstream>

#include <fnmatch.h>
#include <git2/buffer.h>
#include <git2/config.h>
#include <git2/errors.h>
#include <git2/index.h>
#include <git2/repository.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/checkout/standing.hpp"
#include "util/scope/wholeFile.hpp"

namespace vclink::git
{
namespace
{

constexpr const char *byteOrderMark = "\xEF\xBB\xBF";

/// Returns true for a slash such as that in [a/], at which the pattern cannot be split.
bool isInClass(const std::string &pattern, std::size_t slash)
{
    const auto open = slash == std::string::npos ? slash : pattern.rfind('[', slash);
    // The first character of a class can be the one that ends it elsewhere.
    return open != std::string::npos && pattern.find(']', open + 2) > slash;
}

/// Returns the part of a pattern that the name of a file or of a folder above it must match. Tabs
/// and carriage returns at the end may be a part of the name, and a backslash there may escape a
/// blank: then any end matches.
std::string lastElement(std::string pattern)
{
    const auto end = pattern.find_last_not_of(" \t\r/");
    const std::size_t size = end == std::string::npos ? 0 : end + 1;
    const bool hasMore = pattern.find_first_of("\t\r", size) != std::string::npos;
    pattern.resize(size);
    const bool isEscaped = !pattern.empty() && pattern.back() == '\\';
    if (hasMore || isEscaped)
    {
        pattern.resize(pattern.find_last_not_of('\\') + 1);
        pattern += '*';
    }
    const auto slash = pattern.rfind('/');
    return isInClass(pattern, slash) ? "*" : pattern.substr(slash + 1);
}

/// Returns true also if the pattern cannot be understood. A class such as [!a] can match more
/// names if the case counts.
bool mayMatch(const std::string &pattern, const std::string &element)
{
    const auto may = [&](int flags)
    { return ::fnmatch(pattern.c_str(), element.c_str(), flags) != FNM_NOMATCH; };
    return may(0) || may(FNM_CASEFOLD);
}

bool matchesAnElement(const std::string &pattern, const std::string &name)
{
    std::size_t begin = 0;
    for (auto end = name.find('/'); begin < name.size(); end = name.find('/', begin))
    {
        const std::string element = name.substr(begin, end - begin);
        if (mayMatch(pattern, element))
        {
            return true;
        }
        begin = end == std::string::npos ? name.size() : end + 1;
    }
    return false;
}

/// A name, and whether it is that of a link.
struct Name
{
    const std::string &path;
    bool isLink;
};

/// Whether libgit2 takes the line for another pattern than git does. It removes tabs and a single
/// backslash at the end and carriage returns at the beginning, and stops at a form feed; git does
/// none of these, and the pattern then hardly ever matches anything. It takes a link to a folder
/// for a folder.
bool isReadOtherwise(const std::string &line, bool isLink)
{
    const auto lastOf = [&line](const char *others)
    {
        const auto last = line.find_last_not_of(others);
        return last == std::string::npos ? '\0' : line[last];
    };
    const char end = lastOf(" \r/");
    return line.find_first_of("\v\f") != std::string::npos || end == '\t' || end == '\\' ||
           (isLink && lastOf(" \r") == '/') || (!line.empty() && line.front() == '\r');
}

bool isDoubtful(const std::string &line, const Name &name)
{
    const bool isNegated = !line.empty() && line.front() == '!';
    if (!isNegated && !isReadOtherwise(line, name.isLink))
    {
        return false;
    }
    std::string pattern = line.substr(isNegated ? 1 : 0);
    if (!pattern.empty() && pattern.front() == '\r')
    {
        // With or without them.
        pattern.replace(0, pattern.find_first_not_of('\r'), "*");
    }
    return matchesAnElement(lastElement(pattern.substr(0, pattern.find_first_of("\v\f"))),
                            name.path);
}

bool mayNegate(const std::string &path, const Name &name)
{
    // Whoever opens a FIFO waits for a writer.
    if (standingAt(path) == Standing::Special)
    {
        return true;
    }
    std::string content;
    if (readWholeFile(path, content) != 0)
    {
        return standingAt(path) != Standing::Nothing;
    }
    std::istringstream text(content);
    for (std::string line; std::getline(text, line);)
    {
        if (line.rfind(byteOrderMark, 0) == 0)
        {
            line.erase(0, 3);
        }
        if (!line.empty() && line.back() == '\r')
        {
            line.pop_back();
        }
        if (isDoubtful(line, name))
        {
            return true;
        }
    }
    return false;
}

/// Returns the setting, empty if there is none.
/// @throws LibGit2Exception if it cannot be read
std::string excludesFile(git_repository *repository)
{
    const OwnedHandle<git_config> config =
        acquire<git_config>(git_repository_config_snapshot, repository).value();
    git_buf path = {};
    const std::unique_ptr<git_buf, void (*)(git_buf *)> owner(&path, git_buf_dispose);
    const GitResult<void> found =
        call(git_config_get_path, &path, config.get(), "core.excludesfile");
    if (found.has_error() && found.error().getCode() == GIT_ENOTFOUND)
    {
        return {};
    }
    check(found);
    return {path.ptr, path.size};
}

/// git does not follow a link in the working tree, and reads a file that a sparse checkout leaves
/// out from the index.
bool mayNegateInTree(const std::string &root, const std::string &file, git_index *index,
                     const Name &name)
{
    const std::string path = root + file;
    const Standing standing = standingAt(path);
    if (standing == Standing::Nothing)
    {
        const git_index_entry *const entry =
            git_index_get_bypath(index, file.c_str(), GIT_INDEX_STAGE_NORMAL);
        return entry != nullptr && (entry->flags_extended & GIT_INDEX_ENTRY_SKIP_WORKTREE) != 0;
    }
    return standing == Standing::Link || mayNegate(path, name);
}

std::string inEnvironment(const char *variable, const char *path)
{
    const char *const folder = std::getenv(variable);
    return folder != nullptr && *folder != '\0' ? folder + std::string(path) : std::string();
}

} // namespace

bool mayBeNegated(git_repository *repository, git_index *index, const std::string &root,
                  const std::string &name)
{
    const Name named{name, standingAt(root + name) == Standing::Link};
    for (const std::string &path :
         {git_repository_commondir(repository) + std::string("info/exclude"),
          excludesFile(repository), inEnvironment("XDG_CONFIG_HOME", "/git/ignore"),
          inEnvironment("HOME", "/.config/git/ignore")})
    {
        if (!path.empty() && mayNegate(path, named))
        {
            return true;
        }
    }
    if (mayNegateInTree(root, ".gitignore", index, named))
    {
        return true;
    }
    for (auto end = name.find('/'); end != std::string::npos; end = name.find('/', end + 1))
    {
        if (mayNegateInTree(root, name.substr(0, end) + "/.gitignore", index, named))
        {
            return true;
        }
    }
    return false;
}

} // namespace vclink::git
