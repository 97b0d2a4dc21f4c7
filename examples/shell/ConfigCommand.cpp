// SPDX-License-Identifier: MIT
#include <optional>
#include <string>
#include <utility>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "commands.hpp"
#include "fl/i18n/convert.hpp"
#include "names.hpp"
#include "runStoppable.hpp"
#include "texts.hpp"
#include "vclink/git/GitConfig.hpp"

namespace vclink::shell
{
namespace
{

class ConfigCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        line.add_flag(
            "--write", writes_,
            say("Install the tools that come along; this replaces the values that are set"));
        line.footer(say("Shows the merge and diff tools in Git's configuration of this user: one "
                        "line for each that is set,\nits key, a tab, and its value."));
    }

    ExitStatus run(Session &session) override
    {
        git::GitConfig config;
        if (!writes_)
        {
            show(config, session.output());
        }
        else if (const ExitStatus status =
                     runStoppable(session, Stops::Never, [&config] { write(config); });
                 status != Done)
        {
            return status;
        }
        const std::optional<upath> file = config.globalFilePath();
        remark(file ? say("Git's configuration of this user: %1%", nativePath(*file).string())
                    : say("There is no .gitconfig in the home folder."));
        return Done;
    }

  private:
    static void write(git::GitConfig &config)
    {
        config.writeAutoMergeDriver();
        config.writeMergeTool();
        config.writeDiffTool();
    }

    static void show(const git::GitConfig &config, Output &output)
    {
        for (const auto &[key, value] :
             {std::pair("merge.vkAutoMerge.driver", config.readAutoMergeDriver()),
              std::pair("mergetool.vkMerge.cmd", config.readMergeTool()),
              std::pair("difftool.vkDiff.cmd", config.readDiffTool())})
        {
            if (value)
            {
                output.write(std::string(key) + '\t' + makePrintableLine(*value) + '\n');
            }
        }
        output.flush();
    }

    bool writes_ = false;
};

} // namespace

std::unique_ptr<Command> makeConfigCommand()
{
    return std::make_unique<ConfigCommand>();
}

} // namespace vclink::shell
