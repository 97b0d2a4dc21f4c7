// SPDX-License-Identifier: MIT
#include "remotes.hpp"

#include <filesystem>
#include <map>

#include "Session.hpp"
#include "arguments.hpp"
#include "fl/i18n/convert.hpp"
#include "gitProgram.hpp"
#include "names.hpp"
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

std::vector<ustring> readRefspecs(const std::vector<std::string> &refspecs)
{
    std::vector<ustring> texts;
    for (const std::string &refspec : refspecs)
    {
        texts.push_back(fl::i18n::utf8_to_ustring(refspec));
    }
    return texts;
}

} // namespace vclink::shell
