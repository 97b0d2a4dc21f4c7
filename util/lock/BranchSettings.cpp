// SPDX-License-Identifier: MIT
#include "util/lock/BranchSettings.hpp"

#include <algorithm>
#include <cerrno>
#include <cstddef>
#include <cstring>
#include <iterator>
#include <map>
#include <sstream>
#include <utility>

#include <fcntl.h>
#include <git2/config.h>
#include <git2/errors.h>
#include <git2/repository.h>
#include <git2/sys/repository.h>
#include <git2/transaction.h>
#include <unistd.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/callbackException.hpp"
#include "error/errorUtil/libgit2Errors.hpp"
#include "error/errorUtil/libgit2Release.hpp"
#include "error/errorUtil/raiseGitError.hpp"
#include "util/scope/wholeFile.hpp"

namespace vclink::git
{
namespace
{

/// A lock that is not committed closes the configuration as well, before libgit2 1.8.
constexpr bool closesLockedFile = !isLibGit2Since(1, 8);

std::string pathOfConfiguration(git_repository *repository)
{
    return git_repository_commondir(repository) + std::string("config");
}

/// What the configuration has of one key.
struct Values
{
    /// In the file itself.
    std::size_t own = 0;
    /// With those of included files.
    std::size_t all = 0;
    bool isOneMissing = false;
};

using Settings = std::map<std::string, Values>;

struct Search
{
    std::string section;
    Settings found;
};

/// The name of a setting itself has no dots.
bool isOfSection(const std::string &key, const std::string &section)
{
    return key.compare(0, section.size(), section) == 0 &&
           key.find('.', section.size()) == std::string::npos;
}

int note(const git_config_entry *entry, void *payload) noexcept
{
    try
    {
        auto &search = *static_cast<Search *>(payload);
        if (isOfSection(entry->name, search.section))
        {
            Values &values = search.found[entry->name];
            ++values.all;
            values.own += entry->include_depth == 0 ? 1 : 0;
            values.isOneMissing = values.isOneMissing || entry->value == nullptr;
        }
        return 0;
    }
    catch (...)
    {
        return parkCallbackException();
    }
}

/// Returns what the file itself sets, and not only those that it includes.
Settings findSettings(git_config *config, const std::string &branch)
{
    Search search{"branch." + branch + '.', {}};
    check(git_config_foreach, config, note, &search);
    Settings &found = search.found;
    for (auto next = found.begin(); next != found.end();)
    {
        next = next->second.own == 0 ? found.erase(next) : std::next(next);
    }
    return std::move(found);
}

/// Neither call suits all: the first refuses several values, and the second ends the process if a
/// key has no value at all.
void removeFrom(git_config *config, const std::string &key, const Values &values)
{
    if (values.all == 1)
    {
        check(git_config_delete_entry, config, key.c_str());
    }
    else if (!values.isOneMissing)
    {
        check(git_config_delete_multivar, config, key.c_str(), ".*");
    }
    else
    {
        raiseGitError(GIT_ERROR, GIT_ERROR_CONFIG,
                      "'" + key + "' is set several times, and once without a value");
    }
}

[[noreturn]] void raiseUnreadable(const std::string &path)
{
    raiseGitError(GIT_ERROR, GIT_ERROR_CONFIG, "'" + path + "' cannot be read");
}

/// Returns null if there is no file. libgit2 takes one that it may not read for a missing one, and
/// fails without a text.
OwnedHandle<git_config> openFile(const std::string &path)
{
    if (::faccessat(AT_FDCWD, path.c_str(), R_OK, AT_EACCESS) != 0)
    {
        if (errno == ENOENT)
        {
            return nullptr;
        }
        raiseUnreadable(path);
    }
    return acquire<git_config>(git_config_open_ondisk, path.c_str()).value();
}

bool isSpace(char letter)
{
    return std::strchr(" \t\r", letter) != nullptr;
}

/// Returns true for a line with a section's header and a setting, or another header, behind it.
bool hasSettingBesideHeader(const std::string &line)
{
    auto next = std::find_if_not(line.begin(), line.end(), isSpace);
    if (next == line.end() || *next != '[')
    {
        return false;
    }
    for (bool isQuoted = false; next != line.end() && (isQuoted || *next != ']'); ++next)
    {
        isQuoted = isQuoted != (*next == '"');
        if (*next == '\\' && next + 1 != line.end())
        {
            ++next;
        }
    }
    next = next == line.end() ? next : std::find_if_not(next + 1, line.end(), isSpace);
    return next != line.end() && *next != '#' && *next != ';';
}

/// Returns true if the value in this line goes on in the next one. A comment does not.
/// @param isQuoted whether the line begins in quotes, and then whether the next one does
bool goesOn(const std::string &line, bool &isQuoted)
{
    const std::size_t size = line.size() - (!line.empty() && line.back() == '\r' ? 1 : 0);
    for (std::size_t at = 0; at < size && (isQuoted || (line[at] != '#' && line[at] != ';')); ++at)
    {
        isQuoted = isQuoted != (line[at] == '"');
        if (line[at] == '\\' && ++at == size)
        {
            return true;
        }
    }
    isQuoted = false;
    return false;
}

/// Refuses a NUL, where libgit2 would cut off the file, and a setting beside a header, which
/// libgit2 would write twice, or keep although it is to be removed.
void refuseWhatLibGit2CannotWrite(const std::string &path)
{
    std::string content;
    if (readWholeFile(path, content) != 0)
    {
        raiseUnreadable(path);
    }
    std::istringstream text(content);
    bool isContinued = false;
    bool isQuoted = false;
    for (std::string line; std::getline(text, line); isContinued = goesOn(line, isQuoted))
    {
        if (line.find('\0') != std::string::npos)
        {
            raiseGitError(GIT_ERROR, GIT_ERROR_CONFIG,
                          "'" + path +
                              "' contains a NUL character: remove the branch with 'git branch'");
        }
        // A value can go on with a line that begins like a header.
        if (!isContinued && hasSettingBesideHeader(line))
        {
            raiseGitError(GIT_ERROR, GIT_ERROR_CONFIG,
                          "'" + path + "' has a setting in the line of the header '" +
                              line.substr(0, line.find(']') + 1) +
                              "': remove the branch with 'git branch'");
        }
    }
}

} // namespace

BranchSettings::BranchSettings(git_repository *repository, const std::string &branch)
    : mode_(pathOfConfiguration(repository)), file_(openFile(pathOfConfiguration(repository))),
      lock_(nullptr, Unlock{&file_})
{
    const Settings settings = file_ != nullptr ? findSettings(file_.get(), branch) : Settings();
    if (settings.empty())
    {
        return;
    }
    refuseWhatLibGit2CannotWrite(pathOfConfiguration(repository));
    git_transaction *raw = nullptr;
    const GitResult<void> locked = call(git_config_lock, &raw, file_.get());
    lock_.reset(raw);
    check(locked);
    for (const auto &[key, values] : settings)
    {
        removeFrom(file_.get(), key, values);
    }
}

BranchSettings::~BranchSettings() = default;

void BranchSettings::Unlock::operator()(git_transaction *lock) const noexcept
{
    if (closesLockedFile && file != nullptr)
    {
        static_cast<void>(file->release());
    }
    git_transaction_free(lock);
}

void BranchSettings::remove()
{
    if (lock_ != nullptr)
    {
        // libgit2 lets go of the file even if the commit fails.
        lock_.get_deleter().file = nullptr;
        check(git_transaction_commit, lock_.get());
    }
}

WithoutConfiguration::WithoutConfiguration(git_repository *repository)
    : repository_(repository),
      before_(acquire<git_config>(git_repository_config, repository).value())
{
    const OwnedHandle<git_config> none = acquire<git_config>(git_config_new).value();
    check(git_repository_set_config, repository, none.get());
}

WithoutConfiguration::~WithoutConfiguration()
{
    git_error_clear();
    git_repository_set_config(repository_, before_.get());
}

} // namespace vclink::git
