// SPDX-License-Identifier: MIT
#include "Session.hpp"

#include <filesystem>
#include <string>
#include <system_error>

#include "failures.hpp"
#include "names.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

/// What to tell when no folder is served, from the start folder upwards.
std::string describeSearch(const std::filesystem::path &start)
{
    std::string text =
        "Neither " + start.string() + " nor any folder above it is a Git working copy.";
    for (std::filesystem::path folder = start; folder.has_relative_path();
         folder = folder.parent_path())
    {
        std::error_code error;
        if (std::filesystem::exists(folder / ".git", error))
        {
            return text + " There is a repository in " + folder.string() +
                   ", but it can't be opened: it may belong to another user (see git's setting "
                   "safe.directory), or be damaged.";
        }
    }
    return text;
}

/// A clone may bring a folder laid out as a bare repository, whose configuration names commands.
/// @throws ShellFailure if that is possible here
void refuseBareInWorkingCopy(const std::filesystem::path &repository)
{
    if (hasGitEntry(repository))
    {
        return;
    }
    for (std::filesystem::path folder = repository; folder.has_relative_path();)
    {
        folder = folder.parent_path();
        if (hasGitEntry(folder))
        {
            throw ShellFailure(repository.string() +
                               " is a bare repository inside the working copy " + folder.string() +
                               ". If it came with a clone, its\nconfiguration did too, and may "
                               "name commands that then run. If you trust it, use --bare.");
        }
    }
}

/// The back end serves the very root of a working copy, so the search upwards is the host's.
upath findRoot(const CMAdapterFactory &factory, bool takesAnyBare)
{
    const std::filesystem::path start = currentFolder();
    for (std::filesystem::path folder = start;; folder = folder.parent_path())
    {
        upath candidate = makePath(folder);
        // A ".git" folder can be opened too, but the files belong to the folder that holds it.
        if (folder.filename() != ".git" && factory.isAdapterFor(candidate))
        {
            if (!takesAnyBare)
            {
                refuseBareInWorkingCopy(folder);
            }
            return candidate;
        }
        if (!folder.has_relative_path())
        {
            throw ShellFailure(describeSearch(start));
        }
    }
}

} // namespace

Session::Session(Output &output, ProgressLine &progressLine, bool takesAnyBare)
    : output_(output), progressLine_(progressLine), takesAnyBare_(takesAnyBare),
      interactor_(std::make_shared<ShellInteractor>(progressLine))
{
}

Session::~Session() = default;

Output &Session::output() noexcept
{
    return output_;
}

ProgressLine &Session::progressLine() noexcept
{
    return progressLine_;
}

const CMAdapterFactory &Session::factory() const noexcept
{
    return factory_;
}

const std::shared_ptr<ShellInteractor> &Session::interactor() const noexcept
{
    return interactor_;
}

CMAdapter &Session::adapter()
{
    if (adapter_ == nullptr)
    {
        {
            // Held until the adapter has a guard of its own, so that libgit2 starts only once.
            const git::LibGit2Guard guard;
            adapter_ = factory_.createAdapterFor(findRoot(factory_, takesAnyBare_), interactor_);
        }
        // Each guard that has ended, those of the search too, took the merge drivers away.
        guard_.emplace();
    }
    return *adapter_;
}

void Session::endBySignal(int signal) noexcept
{
    endingSignal_ = signal;
}

std::optional<int> Session::endingSignal() const noexcept
{
    return endingSignal_;
}

} // namespace vclink::shell
