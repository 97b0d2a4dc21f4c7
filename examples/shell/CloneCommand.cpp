// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <system_error>

#include <CLI/CLI.hpp>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "fl/i18n/convert.hpp"
#include "names.hpp"
#include "runWithRemote.hpp"

namespace vclink::shell
{
namespace
{

/// The address of what exists on this machine is made absolute, as by git: the clone remembers it,
/// and is used from other folders.
ustring readSpecifier(const std::string &argument)
{
    std::error_code error;
    const std::filesystem::path local = std::filesystem::canonical(argument, error);
    return fl::i18n::utf8_to_ustring(error ? argument : local.string());
}

class CloneCommand : public Command
{
  public:
    void declare(CLI::App &line) override
    {
        specifier_ = declareName(line, "SPECIFIER",
                                 "The repository: a path, or an address such as "
                                 "https://HOST/PATH,\nssh://NAME@HOST/PATH or NAME@HOST:PATH")
                         ->required();
        folder_ =
            declareName(line, "FOLDER", "The working copy to be made: new, or an empty folder")
                ->required();
        line.footer(
            "Copies a repository with its history, and puts the files of its current branch on the "
            "disk. It is\nthe remote \"origin\" of the working copy. Paths are read from the "
            "current folder, after -C.\n\n"
            "Nobody is asked anything: keys are taken from an ssh agent, and passwords are never "
            "given. Every\ncertificate and host key is accepted.\n\n"
            "Ctrl-C stops it while it is sent, and before the first file is written; what was made "
            "is removed. A\nserver that is silent is waited for: when Ctrl-C has not helped for "
            "three seconds, two more end the\nprogram, and may leave an unfinished folder.");
    }

    ExitStatus run(Session &session) override
    {
        const std::filesystem::path folder = resolveArgument(folder_->results().front());
        const ustring specifier = readSpecifier(specifier_->results().front());
        const auto generator = session.factory().createWorkingCopyGenerator(session.interactor());
        remark("Cloning into " + folder.string() + ':');
        RemoteNotes notes;
        const ExitStatus status = runStoppableWithRemote(
            session, notes, [&] { generator->generate(specifier, makePath(folder)); });
        if (status == Done)
        {
            remark("Done.");
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
