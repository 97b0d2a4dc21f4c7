// SPDX-License-Identifier: MIT
#include "remotes.hpp"

#include <algorithm>
#include <filesystem>
#include <map>

#include "Session.hpp"
#include "arguments.hpp"
#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "gitProgram.hpp"
#include "names.hpp"
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

/// Anything but a name is an address.
/// @throws ShellFailure
void refuseUnknownRemote(Session &session, const std::string &name)
{
    const std::vector<std::string> known = remotesOf(session);
    if (name.find_first_of("/:") != std::string::npos ||
        std::find(known.begin(), known.end(), name) != known.end() ||
        settingsOf(session).count("remote." + name + ".pushurl") != 0)
    {
        return;
    }
    const std::string word = showName(name);
    throw ShellFailure(say("There is no remote '%1%'.", word) +
                       (known.empty() && quoteForShell(name) == name
                            ? ' ' + say("Add one with \"git remote add %1% ADDRESS\".", word)
                            : suggest(name, known)));
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
    return "origin";
}

std::unique_ptr<git::GitRemote> openRemote(Session &session, const std::string &name)
{
    CMAdapter &adapter = session.adapter();
    refuseUnknownRemote(session, name);
    std::filesystem::current_path(nativePath(adapter.getRootFolder()));
    return git::GitRemote::create(name, adapter);
}

bool isPushConfigured(Session &session, const std::string &remote)
{
    return settingsOf(session).count("remote." + remote + ".push") != 0;
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
