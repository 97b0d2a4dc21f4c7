// SPDX-License-Identifier: MIT
#include <filesystem>
#include <string>
#include <string_view>
#include <system_error>

#include <CLI/CLI.hpp>
#include <sys/resource.h>

#include "Output.hpp"
#include "Session.hpp"
#include "arguments.hpp"
#include "commands.hpp"
#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "names.hpp"
#include "remotes.hpp"
#include "runWithRemote.hpp"
#include "texts.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::shell
{
namespace
{

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
    std::string name = specifier.substr(specifier.find_last_of("/:") + 1);
    if (name.empty() || name == "." || name == "..")
    {
        throw ShellFailure(say("Nothing was cloned: name a folder for the working copy."));
    }
    return name;
}

bool isEmptyFolder(const std::filesystem::path &folder)
{
    std::error_code ignored;
    return std::filesystem::is_directory(folder, ignored) &&
           std::filesystem::is_empty(folder, ignored);
}

/// @throws ShellFailure if something is in the way
void refuseTaken(const std::filesystem::path &folder)
{
    std::error_code ignored;
    if (std::filesystem::exists(std::filesystem::symlink_status(folder, ignored)) &&
        !isEmptyFolder(folder))
    {
        throw ShellFailure(say("Nothing was cloned: %1% exists, and is not an empty folder.",
                               showPath(makePath(folder))));
    }
}

/// The target of a link to a folder: after a failure libgit2 would remove the link.
std::filesystem::path withoutLinks(const std::filesystem::path &folder)
{
    std::error_code error;
    const std::filesystem::path real = std::filesystem::canonical(folder, error);
    return error ? folder : real;
}

/// The standard library opens a descriptor for each level of what it removes. On most systems a
/// process starts with a limit of 1,024, and can ask for more.
void allowAllDescriptors()
{
    rlimit limit = {};
    if (::getrlimit(RLIMIT_NOFILE, &limit) == 0)
    {
        limit.rlim_cur = limit.rlim_max;
        ::setrlimit(RLIMIT_NOFILE, &limit);
    }
}

/// libgit2 leaves what it has made if it can't even set up the repository, e.g. on a full disk, and
/// very deep folders.
/// @param wasThere whether the folder was there before, which was empty then
void removeUnfinished(const std::filesystem::path &folder, bool wasThere)
{
    allowAllDescriptors();
    std::error_code error;
    if (wasThere)
    {
        for (const auto &entry : std::filesystem::directory_iterator(folder, error))
        {
            std::filesystem::remove_all(entry.path(), error);
        }
    }
    else
    {
        std::filesystem::remove_all(folder, error);
    }
    std::error_code ignored;
    const bool isLeft =
        wasThere ? !isEmptyFolder(folder)
                 : std::filesystem::exists(std::filesystem::symlink_status(folder, ignored));
    if (isLeft)
    {
        complain(say("%1% is unfinished, and can't be removed: %2%. Remove it yourself.",
                     showPath(makePath(folder)), error.message()));
    }
}

void generate(WorkingCopyGenerator &generator, const ustring &specifier,
              const std::filesystem::path &folder)
{
    constexpr int isTaken = -4; // GIT_EEXISTS
    const bool wasThere = isEmptyFolder(folder);
    try
    {
        generator.generate(specifier, makePath(folder));
    }
    catch (const git::LibGit2Exception &failure)
    {
        // What came there since refuseTaken() is somebody else's.
        if (failure.getError().getCode() != isTaken)
        {
            removeUnfinished(folder, wasThere);
        }
        throw;
    }
    catch (...)
    {
        removeUnfinished(folder, wasThere);
        throw;
    }
}

/// Whether the clone has branches of the remote, but no files, because the remote's HEAD names a
/// branch that does not exist. libgit2 does not warn of it.
bool hasOnlyOtherBranches(Session &session, const std::filesystem::path &folder)
{
    constexpr int isUnborn = -9; // GIT_EUNBORNBRANCH
    try
    {
        const auto adapter =
            session.factory().createAdapterFor(makePath(folder), session.interactor());
        const auto manager = git::BranchManager::create(*adapter);
        if (!manager->getRemoteBranches().empty())
        {
            manager->getCurrentBranch();
        }
    }
    catch (const git::LibGit2Exception &failure)
    {
        return failure.getError().getCode() == isUnborn;
    }
    return false;
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
        refuseTaken(folder);
        const auto generator = session.factory().createWorkingCopyGenerator(session.interactor());
        const std::string text = say("Cloning into %1%:", quoteName(makePath(folder).string()));
        remark(text);
        RemoteNotes notes;
        const std::filesystem::path real = withoutLinks(folder);
        const ExitStatus status =
            runStoppableWithRemote(session, Stops::BeforeWriting, text, notes,
                                   [&] { generate(*generator, specifier, real); });
        if (status != Done)
        {
            return status;
        }
        if (hasOnlyOtherBranches(session, real))
        {
            complain(say("The remote's current branch does not exist, so no files were written. "
                         "List its branches with\n\"vclink-shell branches -r\", and check one "
                         "out with \"git switch NAME\"."));
        }
        remark(say("Done."));
        return Done;
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
