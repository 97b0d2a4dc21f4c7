// SPDX-License-Identifier: MIT
#include "wayOut.hpp"

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <filesystem>
#include <system_error>
#include <vector>

#include <pwd.h>
#include <sys/stat.h>
#include <unistd.h>

#include "Session.hpp"
#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "names.hpp"
#include "texts.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/LibGit2Exception.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

namespace fs = std::filesystem;

// GIT_ENONFASTFORWARD, GIT_ELOCKED, GIT_EOWNER.
constexpr int isNoFastForward = -11;
constexpr int isLocked = -14;
constexpr int isOthers = -36;

std::vector<fs::path> findLocks(const fs::path &root)
{
    std::vector<fs::path> locks;
    const fs::path state = hasGitEntry(root) ? stateFolder(root) : root;
    const auto take = [&locks](const fs::path &path)
    {
        std::error_code ignored;
        if (path.extension() == ".lock" && fs::is_regular_file(path, ignored))
        {
            locks.push_back(path.lexically_normal());
        }
    };
    for (const fs::path &folder : {state, sharedFolder(state)})
    {
        std::error_code ignored;
        for (const auto &entry : fs::directory_iterator(folder, ignored))
        {
            take(entry.path());
        }
        for (const auto &entry : fs::recursive_directory_iterator(folder / "refs", ignored))
        {
            take(entry.path());
        }
    }
    std::sort(locks.begin(), locks.end());
    locks.erase(std::unique(locks.begin(), locks.end()), locks.end());
    return locks;
}

std::vector<fs::path> findNamedLocks(CMAdapter &adapter, const std::string &text)
{
    std::vector<fs::path> locks = findLocks(nativePath(adapter.getRootFolder()));
    locks.erase(std::remove_if(locks.begin(), locks.end(),
                               [&text](const fs::path &lock)
                               { return text.find(lock.string()) == std::string::npos; }),
                locks.end());
    return locks;
}

std::string describeAge(const fs::path &file)
{
    using Days = std::chrono::duration<long, std::ratio<86400>>;
    std::error_code ignored;
    const auto age = fs::file_time_type::clock::now() - fs::last_write_time(file, ignored);
    const auto count = [age](auto unit)
    {
        const auto number = std::chrono::duration_cast<decltype(unit)>(age).count();
        return static_cast<std::size_t>(std::max<long>(0, static_cast<long>(number)));
    };
    if (age < std::chrono::minutes(2))
    {
        return sayCount(count(std::chrono::seconds()), "%1% second", "%1% seconds");
    }
    if (age < std::chrono::hours(2))
    {
        return sayCount(count(std::chrono::minutes()), "%1% minute", "%1% minutes");
    }
    return age < Days(2) ? sayCount(count(std::chrono::hours()), "%1% hour", "%1% hours")
                         : sayCount(count(Days()), "%1% day", "%1% days");
}

/// libgit2 has the same words, and often the same code, for a lock and for a file that the user has
/// no right to read or write.
bool isDenied(const std::string &text)
{
    return text.find(std::generic_category().message(EACCES)) != std::string::npos;
}

std::string explainDenial()
{
    return say("The file is not locked: you have no permission to read or write it. Check the "
               "permissions of the file\nand of the folders that contain it.");
}

bool canBeOpened(CMAdapter &adapter)
{
    try
    {
        git::BranchManager::create(adapter)->getRepositoryState();
        return true;
    }
    catch (const git::LibGit2Exception &)
    {
        return false;
    }
}

/// libgit2 says "unsupported" of other things too, e.g. of an address.
bool isOfFormat(const ustring &message)
{
    return message.find(u"unsupported repository ") == 0 ||
           message.find(u"unsupported extension ") == 0 ||
           message.find(u"unknown object format ") == 0;
}

/// Whether a fetch could not make a reference, because an older one has the name of its folder, or
/// is in a folder of its name. libgit2's text depends on whether the older one is packed.
bool isBlockedByOlder(const ustring &message)
{
    const auto has = [&message](const ustring &words)
    { return message.find(words) != ustring::npos; };
    return has(u"refs/remotes/") &&
           (has(u"collides with existing one") || has(u"there are refs beneath that folder") ||
            has(u"parent is not directory"));
}

std::string nameOf(::uid_t user)
{
    const ::passwd *const entry = ::getpwuid(user);
    return entry == nullptr ? std::to_string(user) : entry->pw_name;
}

} // namespace

void tellWayOut(Session &session)
{
    try
    {
        throw;
    }
    catch (const git::LibGit2Exception &failure)
    {
        const int code = failure.getError().getCode();
        const std::string text = fl::i18n::ustring_to_utf8(failure.getError().getMessage());
        if (isDenied(text) && text.find(" locked: ") != std::string::npos)
        {
            complain(explainDenial());
            return;
        }
        if (!session.hasAdapter())
        {
            // A clone has no repository to look at.
            return;
        }
        const bool namesSetting =
            failure.getError().getMessage().find(u"safe.directory") != ustring::npos;
        if (code == isLocked)
        {
            tellLocks(session.adapter(), text);
        }
        else if (code == isNoFastForward)
        {
            complain(say("Download the remote's commits with \"vclink-shell fetch\", merge them, "
                         "and push again. To discard\nthem there instead, put a plus before the "
                         "branch: \"vclink-shell push REMOTE +BRANCH\"."));
        }
        else if (isBlockedByOlder(failure.getError().getMessage()))
        {
            complain(
                say("Branches such as \"a\" and \"a/b\" can't exist side by side. If the remote "
                    "has deleted the older one,\n\"git fetch --prune REMOTE\" deletes it here "
                    "too, and fetches the new one."));
        }
        else if (isOfFormat(failure.getError().getMessage()))
        {
            complain(explainFormat(nativePath(session.adapter().getRootFolder())));
        }
        else if (code == isOthers || namesSetting)
        {
            const std::string root = nativePath(session.adapter().getRootFolder()).string();
            const std::string advice = explainOwner(root);
            if (!advice.empty())
            {
                complain(advice);
            }
        }
    }
    catch (const std::exception &)
    {
        // The text has all that is known.
    }
}

bool tellRemoteFormat(Session &session, const git::GitError &failure)
{
    const bool isOfRemote = isOfFormat(failure.getMessage()) &&
                            (!session.hasAdapter() || canBeOpened(session.adapter()));
    if (isOfRemote)
    {
        complain(say("libgit2 does not know the format of the remote repository; "
                     "core.repositoryformatversion and extensions in\nits configuration describe "
                     "it. If git can work with it, use git."));
    }
    return isOfRemote;
}

bool namesLock(CMAdapter &adapter, const std::string &text)
{
    return !findNamedLocks(adapter, text).empty();
}

void tellLocks(CMAdapter &adapter, const std::string &reason)
{
    const std::vector<fs::path> named = findNamedLocks(adapter, reason);
    if (named.empty() && isDenied(reason))
    {
        complain(explainDenial());
        return;
    }
    const std::vector<fs::path> locks =
        named.empty() ? findLocks(nativePath(adapter.getRootFolder())) : named;
    for (const fs::path &lock : locks)
    {
        complain(say("%1% was made %2% ago. If no other program is using Git here, remove it, and "
                     "try again.",
                     quoteName(makePath(lock).string()), describeAge(lock)));
    }
    if (locks.empty())
    {
        complain(say("Another program was using Git here. Try again."));
    }
}

std::string explainFormat(const fs::path &folder)
{
    const fs::path state = hasGitEntry(folder) ? stateFolder(folder) : folder;
    return say("libgit2 does not know the format of this repository; core.repositoryformatversion "
               "and extensions in\n%1% describe it. If git can work here, use git.",
               showPath(makePath((sharedFolder(state) / "config").lexically_normal())));
}

std::string explainOwner(const std::string &folder)
{
    struct stat status = {};
    const bool isKnown =
        ::stat((folder + "/.git").c_str(), &status) == 0 || ::stat(folder.c_str(), &status) == 0;
    if (!isKnown || status.st_uid == ::geteuid())
    {
        return {};
    }
    return say("The repository belongs to %1%. If you trust it, run: git config --global --add "
               "safe.directory %2%",
               nameOf(status.st_uid), quoteForShell(folder));
}

} // namespace vclink::shell
