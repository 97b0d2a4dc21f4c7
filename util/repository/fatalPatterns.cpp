// SPDX-License-Identifier: MIT
#include "util/repository/fatalPatterns.hpp"

#include <algorithm>
#include <string_view>

#include <git2/errors.h>
#include <git2/index.h>
#include <git2/repository.h>
#include <sys/stat.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/raiseGitError.hpp"
#include "util/scope/wholeFile.hpp"

namespace vclink::git
{
namespace
{

/// One pattern as libgit2 reads it.
struct Pattern
{
    /// false for a comment, an empty line, and what libgit2 takes for one
    bool isRule = false;
    bool isNegated = false;
    bool hasWildcards = false;
    std::string_view text;
};

bool isBlank(char character)
{
    return character == ' ' || character == '\t';
}

/// Returns true if a blank at the end is a part of the pattern.
bool isEscaped(std::string_view text)
{
    text.remove_suffix(1);
    const auto last = text.find_last_not_of('\\');
    const std::size_t backslashes = text.size() - (last == std::string_view::npos ? 0 : last + 1);
    return backslashes % 2 == 1;
}

/// Takes off the ends that are no part of the name. A backslash alone goes, too, at the very end.
std::string_view trimmed(std::string_view text)
{
    if (!text.empty() && text.back() == '\r')
    {
        text.remove_suffix(1);
    }
    while (!text.empty() && isBlank(text.back()) && !isEscaped(text))
    {
        text.remove_suffix(1);
    }
    return text;
}

/// Goes through a text as libgit2's parser does. It does not go by lines: a backslash before a line
/// break makes that a part of the pattern, and a form feed ends a pattern.
class PatternReader
{
  public:
    explicit PatternReader(std::string_view text) : rest_(text)
    {
    }

    bool isAtEnd() const
    {
        return rest_.empty();
    }
    std::size_t left() const
    {
        return rest_.size();
    }

    Pattern read()
    {
        Pattern pattern;
        if (rest_.front() == '#' || rest_.front() == '\n' || rest_.substr(0, 2) == "\r\n")
        {
            passLine();
            return pattern;
        }
        pattern.isNegated = rest_.front() == '!';
        rest_.remove_prefix(pattern.isNegated ? 1 : 0);
        const std::size_t size = findEnd(pattern);
        const std::size_t start = !rest_.empty() && rest_.front() == '/' ? 1 : 0;
        pattern.text = trimmed(rest_.substr(0, size).substr(std::min(start, size)));
        pattern.isRule = !pattern.text.empty();
        rest_.remove_prefix(size);
        if (pattern.isRule)
        {
            passLine();
        }
        return pattern;
    }

  private:
    /// Returns where the pattern ends: before a line break or the like that is not escaped.
    std::size_t findEnd(Pattern &pattern) const
    {
        bool isEscaped = false;
        for (std::size_t place = 0; place < rest_.size(); ++place)
        {
            const char character = rest_[place];
            if (!isEscaped && std::string_view("\n\v\f").find(character) != std::string_view::npos)
            {
                return place;
            }
            pattern.hasWildcards =
                pattern.hasWildcards ||
                (!isEscaped && std::string_view("*?[").find(character) != std::string_view::npos);
            isEscaped = !isEscaped && character == '\\';
        }
        return rest_.size();
    }

    void passLine()
    {
        rest_.remove_prefix(std::min(rest_.find('\n'), rest_.size()));
        rest_.remove_prefix(std::min(rest_.find_first_not_of("\r\n"), rest_.size()));
    }

    std::string_view rest_;
};

/// Returns true if libgit2 keeps an empty text of the pattern: a slash at the end is no part of it,
/// and neither is a backslash that escapes nothing.
bool isKeptEmpty(const Pattern &pattern)
{
    std::string_view text = pattern.text;
    if (!text.empty() && text.back() == '/')
    {
        text.remove_suffix(1);
    }
    return pattern.isRule && (text.empty() || text == "\\");
}

std::string textOf(const std::string &path)
{
    struct stat status = {};
    const bool isThere = ::stat(path.c_str(), &status) == 0;
    if (isThere && S_ISFIFO(status.st_mode))
    {
        raiseGitError(GIT_ERROR, GIT_ERROR_REPOSITORY,
                      "'" + path + "' is a FIFO, and libgit2 would wait for a writer: remove it");
    }
    if (!isThere || !S_ISREG(status.st_mode))
    {
        return {};
    }
    std::string text;
    return readWholeFile(path, text) == 0 ? text : std::string();
}

void refuseFatalPatternsIn(const std::string &path, PatternPlace place)
{
    const FatalPattern found = findFatalPattern(textOf(path), place);
    if (found.fault != PatternFault::None)
    {
        raiseGitError(GIT_ERROR, GIT_ERROR_REPOSITORY,
                      "line " + std::to_string(found.number) + " of '" + path + "' would " +
                          (found.fault == PatternFault::EndsProcess
                               ? "end the process"
                               : "keep the operation from ending") +
                          ", by a fault of libgit2: remove the line");
    }
}

bool hasPatterns(std::string_view path)
{
    constexpr std::string_view name = "/.gitignore";
    return path.size() > name.size() && path.substr(path.size() - name.size()) == name;
}

/// A submodule that cannot be opened is none to libgit2 either.
void refuseFatalPatternsInSubmodule(const std::string &folder)
{
    struct stat status = {};
    if (lstat(folder.c_str(), &status) != 0 || !S_ISDIR(status.st_mode))
    {
        return;
    }
    const GitResult<OwnedHandle<git_repository>> submodule = acquire<git_repository>(
        git_repository_open_ext, folder.c_str(), GIT_REPOSITORY_OPEN_NO_SEARCH, nullptr);
    if (submodule.has_value())
    {
        refuseFatalPatterns(submodule.value().get());
        refuseFatalPatternsInFolders(submodule.value().get());
    }
}

} // namespace

FatalPattern findFatalPattern(const std::string &text, PatternPlace place)
{
    constexpr std::string_view byteOrderMark = "\xEF\xBB\xBF";
    // For libgit2, the text ends there.
    std::string_view content(text.c_str());
    content.remove_prefix(
        content.substr(0, byteOrderMark.size()) == byteOrderMark ? byteOrderMark.size() : 0);
    PatternReader reader(content);
    bool hasWildcards = false;
    while (!reader.isAtEnd())
    {
        const std::size_t left = reader.left();
        const Pattern pattern = reader.read();
        const bool endsProcess = place == PatternPlace::Root && pattern.isNegated &&
                                 !pattern.hasWildcards && hasWildcards && isKeptEmpty(pattern);
        const bool neverEnds = reader.left() == left;
        if (endsProcess || neverEnds)
        {
            const auto begin = content.begin();
            const auto line = begin + static_cast<std::ptrdiff_t>(content.size() - left);
            return {endsProcess ? PatternFault::EndsProcess : PatternFault::NeverEnds,
                    static_cast<int>(std::count(begin, line, '\n')) + 1};
        }
        hasWildcards = hasWildcards || (pattern.isRule && pattern.hasWildcards);
    }
    return {};
}

void refuseFatalPatterns(git_repository *repository)
{
    const char *const workdir = git_repository_workdir(repository);
    if (workdir != nullptr)
    {
        refuseFatalPatternsIn(workdir + std::string(".gitignore"), PatternPlace::Root);
    }
    refuseFatalPatternsIn(git_repository_commondir(repository) + std::string("info/exclude"),
                          PatternPlace::Root);
}

void refuseFatalPatternsInFolders(git_repository *repository)
{
    const GitResult<OwnedHandle<git_index>> index =
        acquire<git_index>(git_repository_index, repository);
    if (index.has_value())
    {
        refuseFatalPatternsInFolders(repository, index.value().get());
    }
}

void refuseFatalPatternsInFolders(git_repository *repository, git_index *index)
{
    const char *const workdir = git_repository_workdir(repository);
    const std::size_t count = workdir != nullptr ? git_index_entrycount(index) : 0;
    for (std::size_t i = 0; i < count; ++i)
    {
        const git_index_entry &entry = *git_index_get_byindex(index, i);
        if (entry.mode == GIT_FILEMODE_COMMIT)
        {
            refuseFatalPatternsInSubmodule(std::string(workdir) + entry.path);
        }
        else if (hasPatterns(entry.path))
        {
            refuseFatalPatternsIn(std::string(workdir) + entry.path, PatternPlace::Folder);
        }
    }
}

} // namespace vclink::git
