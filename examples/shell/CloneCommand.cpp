// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <string_view>
#include <system_error>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "names.hpp"
#include "runWithRemote.hpp"
#include "texts.hpp"

namespace vclink::shell
{
namespace
{

/// As git reads an address: a colon before the first slash ends a scheme or a host.
bool isPath(const std::string &argument)
{
    const std::size_t colon = argument.find(':');
    return colon == std::string::npos || argument.find('/') < colon;
}

/// The address of what exists on this machine is made absolute, as by git: the clone remembers it,
/// and is used from other folders.
/// @throws ShellFailure if it is the path of nothing
ustring readSpecifier(const std::string &argument)
{
    std::error_code error;
    const std::filesystem::path local = std::filesystem::canonical(argument, error);
    if (error && isPath(argument))
    {
        throw ShellFailure(say("Nothing was cloned: %1% can't be found: %2%.",
                               quoteName(fl::i18n::utf8_to_ustring(argument)), error.message()));
    }
    return fl::i18n::utf8_to_ustring(error ? argument : local.string());
}

/// The last part of an address, without ".git", as git names the folder.
/// @throws ShellFailure if there is none
std::string nameFor(std::string specifier)
{
    const auto takeOff = [&specifier](std::string_view end)
    {
        const bool ends = specifier.size() > end.size() &&
                          specifier.compare(specifier.size() - end.size(), end.size(), end) == 0;
        specifier.erase(ends ? specifier.size() - end.size() : specifier.size());
        return ends;
    };
    while (takeOff("/"))
    {
    }
    takeOff("/.git") || takeOff(".git");
    const std::string name = specifier.substr(specifier.find_last_of("/:") + 1);
    if (name.empty() || name == "." || name == "..")
    {
        throw ShellFailure(say("Nothing was cloned: name a folder for the working copy."));
    }
    return name;
}

class CloneCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        specifier_ = declareName(line, "SPECIFIER",
                                 say("The repository: a path, or an address such as "
                                     "https://HOST/PATH,\nssh://NAME@HOST/PATH or NAME@HOST:PATH"))
                         ->required();
        folder_ = declareName(line, "FOLDER",
                              say("The working copy to be made: new, or an empty folder; without "
                                  "it,\nnamed like the repository"));
        line.footer(say("Copies a repository with its history, and writes the files of its current "
                        "branch. It becomes the\nremote \"origin\" of the working copy.\n\n"
                        "Never prompts: keys come from an ssh agent, and a password only from the "
                        "address. Every\ncertificate and host key is accepted."));
    }

    ExitStatus run(Session &session) override
    {
        const std::string &argument = specifier_->results().front();
        const ustring specifier = readSpecifier(argument);
        const std::filesystem::path folder =
            resolveArgument(folder_->empty() ? nameFor(argument) : folder_->results().front());
        const auto generator = session.factory().createWorkingCopyGenerator(session.interactor());
        const std::string text = say("Cloning into %1%:", quoteName(makePath(folder).string()));
        remark(text);
        RemoteNotes notes;
        const ExitStatus status =
            runStoppableWithRemote(session, Stops::BeforeWriting, text, notes,
                                   [&] { generator->generate(specifier, makePath(folder)); });
        if (status == Done)
        {
            remark(say("Done."));
        }
        return status;
    }

  private:
    const CLI::Option *specifier_ = nullptr;
    const CLI::Option *folder_ = nullptr;
};

} // namespace

std::unique_ptr<Command> makeCloneCommand()
{
    return std::make_unique<CloneCommand>();
}

} // namespace vclink::shell
