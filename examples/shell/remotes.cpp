// SPDX-License-Identifier: MIT
#include "remotes.hpp"

#include <algorithm>
#include <cerrno>
#include <filesystem>
#include <map>
#include <system_error>

#include "Session.hpp"
#include "arguments.hpp"
#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "gitProgram.hpp"
#include "names.hpp"
#include "revisions.hpp"
#include "suggestions.hpp"
#include "texts.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::shell
{
namespace
{

std::map<std::string, std::string> settingsOf(Session &session)
{
    return readRemoteSettings(nativePath(session.adapter().getRootFolder()));
}

/// The names of the remotes that git's settings have.
std::vector<std::string> remotesOf(Session &session)
{
    const std::string begin = "remote.";
    const std::string end = ".url";
    std::vector<std::string> names;
    for (const auto &[key, value] : settingsOf(session))
    {
        const bool isUrl = key.size() > begin.size() + end.size() && key.find(begin) == 0 &&
                           key.compare(key.size() - end.size(), end.size(), end) == 0;
        if (isUrl)
        {
            names.push_back(key.substr(begin.size(), key.size() - begin.size() - end.size()));
        }
    }
    return names;
}

std::string joinNames(const std::vector<std::string> &names)
{
    std::string text;
    for (const std::string &name : names)
    {
        text += (text.empty() ? "" : ", ") + showName(name);
    }
    return text;
}

/// What to say of a name that is none of the remotes.
std::string adviseOnRemote(Session &session, const std::string &name,
                           const std::vector<std::string> &known)
{
    const std::string word = showName(name);
    if (name.find_first_of("/:") != std::string::npos)
    {
        return ' ' + say("To use an address, give it a name: \"%1%\".",
                         "git remote add NAME " + quoteForShell(name));
    }
    if (known.empty())
    {
        return quoteForShell(name) == name
                   ? ' ' + say("Add one with \"git remote add %1% ADDRESS\".", word)
                   : std::string();
    }
    if (isBranch(*git::BranchManager::create(session.adapter()), name))
    {
        const bool hasOrigin = std::find(known.begin(), known.end(), "origin") != known.end();
        return ' ' + say("'%1%' is a branch: name the remote before it, e.g. \"%2% %1%\".", word,
                         hasOrigin ? "origin" : showName(known.front()));
    }
    const std::string suggestion = suggest(name, known);
    return suggestion.empty() ? ' ' + say("Remotes: %1%.", joinNames(known)) : suggestion;
}

/// Without git it is unknown which remotes there are.
/// @throws ShellFailure if there is no remote of this name
void refuseUnknownRemote(Session &session, const std::string &name)
{
    const std::vector<std::string> known = remotesOf(session);
    const bool isKnown = std::find(known.begin(), known.end(), name) != known.end() ||
                         settingsOf(session).count("remote." + name + ".pushurl") != 0;
    if (!isKnown && runGit(nativePath(session.adapter().getRootFolder()), {"version"}))
    {
        throw ShellFailure(say("There is no remote '%1%'.", showName(name)) +
                           adviseOnRemote(session, name, known));
    }
}

/// The address of a remote; empty if git does not know it.
std::string addressOf(Session &session, const std::string &name, Direction direction)
{
    const auto root = nativePath(session.adapter().getRootFolder());
    std::vector<std::string> words{"remote", "get-url"};
    if (direction == Direction::There)
    {
        words.emplace_back("--push");
    }
    words.insert(words.end(), {"--", name});
    std::string address = runGit(root, words).value_or("");
    address.erase(std::min(address.find('\n'), address.size()));
    return address;
}

/// libgit2 takes the path of nothing for an address of an unknown kind.
/// @throws ShellFailure if the address of a remote is the path of nothing
void refuseMissingPath(const std::string &address, const std::string &name)
{
    std::error_code error;
    if (!address.empty() && isPath(address) && !std::filesystem::exists(address, error))
    {
        throw ShellFailure(
            say("There is no repository under the path of the remote '%1%', %2%: %3%.",
                showName(name), quoteName(fl::i18n::utf8_to_ustring(address)),
                std::generic_category().message(error ? error.value() : ENOENT)));
    }
}

} // namespace

CLI::Option *declareRemote(CLI::App &line)
{
    return declareName(line, "REMOTE",
                       say("The remote's name; without it, that of the current branch, or\n"
                           "else origin"));
}

std::string chooseRemote(Session &session, const CLI::Option &name, Direction direction)
{
    if (!name.empty())
    {
        return name.results().front();
    }
    const auto manager = git::BranchManager::create(session.adapter());
    const std::string branch = "branch." + findCurrentBranch(*manager).value_or("") + '.';
    const std::map<std::string, std::string> settings = settingsOf(session);
    std::vector<std::string> keys;
    if (direction == Direction::There)
    {
        keys = {branch + "pushremote", "remote.pushdefault"};
    }
    keys.push_back(branch + "remote");
    for (const std::string &key : keys)
    {
        const auto found = settings.find(key);
        // A branch that follows another one here has no remote.
        if (found != settings.end() && !found->second.empty() && found->second != ".")
        {
            return found->second;
        }
    }
    const std::vector<std::string> known = remotesOf(session);
    return known.size() == 1 ? known.front() : "origin";
}

std::unique_ptr<git::GitRemote> openRemote(Session &session, const std::string &name,
                                           Direction direction)
{
    CMAdapter &adapter = session.adapter();
    refuseUnknownRemote(session, name);
    std::filesystem::current_path(nativePath(adapter.getRootFolder()));
    refuseMissingPath(addressOf(session, name, direction), name);
    return git::GitRemote::create(name, adapter);
}

bool pushesElsewhere(Session &session, const std::string &remote)
{
    const auto root = nativePath(session.adapter().getRootFolder());
    return runGit(root, {"remote", "get-url", "--all", "--", remote}) !=
           runGit(root, {"remote", "get-url", "--push", "--all", "--", remote});
}

std::vector<std::string> configuredRefspecs(Session &session, const std::string &remote,
                                            Direction direction)
{
    const std::string setting =
        "remote." + remote + (direction == Direction::There ? ".push" : ".fetch");
    return splitAtNul(runGit(nativePath(session.adapter().getRootFolder()),
                             {"config", "-z", "--get-all", setting})
                          .value_or(""));
}

std::optional<std::string> findCurrentBranch(const git::BranchManager &manager)
{
    try
    {
        return manager.getCurrentBranch().getName();
    }
    catch (const git::LibGit2Exception &)
    {
        return std::nullopt;
    }
}

bool isPath(const std::string &address)
{
    const std::size_t colon = address.find(':');
    return colon == std::string::npos || address.find('/') < colon;
}

std::string hexadecimal(const git::GitRemoteHead::Id &id)
{
    constexpr const char *digits = "0123456789abcdef";
    std::string text;
    for (const unsigned char byte : id)
    {
        text += digits[byte >> 4U];
        text += digits[byte & 0xFU];
    }
    return text;
}

std::vector<ustring> readRefspecs(const std::vector<std::string> &refspecs)
{
    std::vector<ustring> texts;
    texts.reserve(refspecs.size());
    for (const std::string &refspec : refspecs)
    {
        texts.push_back(fl::i18n::utf8_to_ustring(refspec));
    }
    return texts;
}

} // namespace vclink::shell
