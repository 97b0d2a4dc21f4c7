// SPDX-License-Identifier: MIT
#include <string>
#include <string_view>
#include <vector>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "commands.hpp"
#include "fl/i18n/convert.hpp"
#include "names.hpp"
#include "texts.hpp"
#include "vclink/git/BranchManager.hpp"

namespace vclink::shell
{
namespace
{

std::string shortName(const std::string &name, std::string_view folder)
{
    return name.compare(0, folder.size(), folder) == 0 ? name.substr(folder.size()) : name;
}

class BranchesCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        line.add_flag("-r", showsRemote_,
                      say("The branches that were fetched from remote repositories"));
        line.add_flag("-z", endWithNul_,
                      say("End each line with NUL, and write names byte for byte"));
        line.footer(
            say("One line for each branch: its short name, which the other commands take."));
    }

    ExitStatus run(Session &session) override
    {
        const auto manager = git::BranchManager::create(session.adapter());
        const std::vector<git::BranchPointer> branches =
            showsRemote_ ? manager->getRemoteBranches() : manager->getLocalBranches();
        const std::string_view folder = showsRemote_ ? "refs/remotes/" : "refs/heads/";
        for (const git::BranchPointer &branch : branches)
        {
            const std::string name = shortName(branch.getName(), folder);
            if (endWithNul_)
            {
                session.output().writeRaw(name + '\0');
            }
            else
            {
                session.output().write(quoteName(fl::i18n::utf8_to_ustring(name)) + '\n');
            }
        }
        session.output().flush();
        remark(sayCount(branches.size(), "%1% branch", "%1% branches"));
        return Done;
    }

  private:
    bool showsRemote_ = false;
    bool endWithNul_ = false;
};

} // namespace

std::unique_ptr<Command> makeBranchesCommand()
{
    return std::make_unique<BranchesCommand>();
}

} // namespace vclink::shell
