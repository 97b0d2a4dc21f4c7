// SPDX-License-Identifier: MIT
#include <array>
#include <cstdlib>
#include <filesystem>
#include <optional>
#include <string>
#include <system_error>
#include <vector>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "gitProgram.hpp"
#include "names.hpp"
#include "runStoppable.hpp"
#include "texts.hpp"
#include "vclink/git/GitConfig.hpp"

namespace vclink::shell
{
namespace
{

namespace fs = std::filesystem;

struct Setting
{
    std::string key;
    std::optional<ustring> value;
};

std::array<Setting, 3> readSettings(const git::GitConfig &config)
{
    return {Setting{"merge.vkAutoMerge.driver", config.readAutoMergeDriver()},
            Setting{"mergetool.vkMerge.cmd", config.readMergeTool()},
            Setting{"difftool.vkDiff.cmd", config.readDiffTool()}};
}

/// The file that libgit2 writes to.
/// @return an empty path if there is none
fs::path findWrittenFile(const git::GitConfig &config)
{
    const char *const xdg = std::getenv("XDG_CONFIG_HOME");
    const char *const home = std::getenv("HOME");
    fs::path folder = xdg != nullptr ? xdg : "";
    if (xdg == nullptr && home != nullptr)
    {
        folder = fs::path(home) / ".config";
    }
    fs::path file = folder / "git/config";
    std::error_code ignored;
    if (!folder.empty() && fs::exists(file, ignored))
    {
        return file;
    }
    const std::optional<upath> global = config.globalFilePath();
    return global ? nativePath(*global) : fs::path();
}

/// What git uses outside of repositories, whose own configuration may intentionally differ.
struct UsedSetting
{
    fs::path file;
    std::string value;
};

/// @return nothing if git is not installed, or finds no value in a file
std::optional<UsedSetting> askGit(const std::string &key)
{
    const std::string origin = "file:";
    const std::vector<std::string> parts =
        splitAtNul(runGit("/", {"config", "-z", "--show-origin", "--get", key}).value_or(""));
    if (parts.size() != 2 || parts.front().find(origin) != 0)
    {
        return std::nullopt;
    }
    return UsedSetting{parts.front().substr(origin.size()), parts.back()};
}

/// git reads .gitconfig after the file that libgit2 writes to, if the user has both.
/// @return whether git uses what was written
bool checkThatGitUses(const git::GitConfig &config)
{
    bool isUsed = true;
    for (const auto &[key, value] : readSettings(config))
    {
        const std::optional<UsedSetting> used = askGit(key);
        if (!value || !used || fl::i18n::utf8_to_ustring(used->value) == *value)
        {
            continue;
        }
        isUsed = false;
        complain(
            say("%1% was written to %2%, but git uses the value in\n%3%. Remove that one: %4%", key,
                quoteName(makePath(findWrittenFile(config)).string()),
                quoteName(makePath(used->file).string()),
                "git config --file " + quoteForShell(used->file.string()) + " --unset-all " + key));
    }
    return isUsed;
}

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
        if (writes_)
        {
            return install(session, config);
        }
        show(config, session.output());
        const std::optional<upath> file = config.globalFilePath();
        remark(file ? say("Git's configuration of this user: %1%", nativePath(*file).string())
                    : say("There is no .gitconfig in the home folder."));
        return Done;
    }

  private:
    static ExitStatus install(Session &session, git::GitConfig &config)
    {
        const ExitStatus status = runStoppable(session, Stops::Never, [&config] { write(config); });
        if (status != Done)
        {
            return status;
        }
        if (!checkThatGitUses(config))
        {
            return Failed;
        }
        remark(say("Git's configuration of this user: %1%", findWrittenFile(config).string()));
        return Done;
    }

    static void write(git::GitConfig &config)
    {
        config.writeAutoMergeDriver();
        config.writeMergeTool();
        config.writeDiffTool();
    }

    static void show(const git::GitConfig &config, Output &output)
    {
        for (const auto &[key, value] : readSettings(config))
        {
            if (value)
            {
                output.write(key + '\t' + makePrintableLine(*value) + '\n');
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
