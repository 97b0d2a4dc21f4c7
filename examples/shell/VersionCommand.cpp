// SPDX-License-Identifier: MIT
#include "Output.hpp"
#include "Session.hpp"
#include "commands.hpp"
#include "vclink/git/LibGit2Version.hpp"

namespace vclink::shell
{
namespace
{

class VersionCommand : public Command
{
  public:
    void declare(CLI::App & /*line*/) override
    {
    }

    ExitStatus run(Session &session) override
    {
        session.output().write(versionText());
        return Done;
    }
};

} // namespace

std::string versionText()
{
    return "vclink-shell " VCLINK_SHELL_VERSION "\nlibgit2 " + git::LibGit2Version().toString() +
           '\n';
}

std::unique_ptr<Command> makeVersionCommand()
{
    return std::make_unique<VersionCommand>();
}

} // namespace vclink::shell
