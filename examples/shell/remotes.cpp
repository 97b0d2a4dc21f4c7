// SPDX-License-Identifier: MIT
#include "remotes.hpp"

#include <filesystem>
#include <string>

#include "Session.hpp"
#include "arguments.hpp"
#include "fl/i18n/convert.hpp"
#include "names.hpp"

namespace vclink::shell
{

CLI::Option *declareRemote(CLI::App &line)
{
    return declareName(line, "REMOTE", "The remote's name, e.g. origin")->required();
}

std::unique_ptr<git::GitRemote> openRemote(Session &session, const CLI::Option &name)
{
    CMAdapter &adapter = session.adapter();
    std::filesystem::current_path(nativePath(adapter.getRootFolder()));
    return git::GitRemote::create(name.results().front(), adapter);
}

std::vector<ustring> readRefspecs(const CLI::Option &option)
{
    std::vector<ustring> refspecs;
    for (const std::string &refspec : option.results())
    {
        refspecs.push_back(fl::i18n::utf8_to_ustring(refspec));
    }
    return refspecs;
}

} // namespace vclink::shell
