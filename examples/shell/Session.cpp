// SPDX-License-Identifier: MIT
#include "Session.hpp"

#include <filesystem>
#include <string>
#include <system_error>
#include <utility>

#include "failures.hpp"
#include "fl/i18n/convert.hpp"
#include "names.hpp"
#include "texts.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/LibGit2Exception.hpp"
#include "wayOut.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

/// Why a repository can't be opened, in the back end's words or better ones.
std::string explainRefusal(const CMAdapterFactory &factory, const std::filesystem::path &folder,
                           const std::shared_ptr<ShellInteractor> &interactor)
{
    std::string owner = explainOwner(folder.string());
    if (!owner.empty())
    {
        return owner;
    }
    try
    {
        const auto adapter = factory.createAdapterFor(makePath(folder), interactor);
        git::BranchManager::create(*adapter)->getRepositoryState();
        return {};
    }
    catch (const git::LibGit2Exception &failure)
    {
        return fl::i18n::ustring_to_utf8(failure.GetUnicodeMessageTxt());
    }
    catch (const std::exception &failure)
    {
        return failure.what();
    }
}

/// What to tell when no folder is served, from the start folder upwards.
std::string describeSearch(const CMAdapterFactory &factory, const std::filesystem::path &start,
                           const std::shared_ptr<ShellInteractor> &interactor)
{
    std::string text =
        say("Neither %1% nor any folder above it is a Git working copy.", start.string());
    for (std::filesystem::path folder = start; folder.has_relative_path();
         folder = folder.parent_path())
    {
        std::error_code error;
        if (std::filesystem::exists(folder / ".git", error))
        {
            return text + '\n' +
                   say("There is a repository in %1%, but it can't be opened.", folder.string()) +
                   '\n' + explainRefusal(factory, folder, interactor);
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
            throw ShellFailure(say(
                "%1% is a bare repository inside the working copy %2%. If it came with a clone, so "
                "did\nits configuration, which can run commands. If you trust it, use --bare.",
                repository.string(), folder.string()));
        }
    }
}

/// The back end serves the very root of a working copy, so the search upwards is the host's.
upath findRoot(const CMAdapterFactory &factory, bool takesAnyBare,
               const std::shared_ptr<ShellInteractor> &interactor)
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
            throw ShellFailure(describeSearch(factory, start, interactor));
        }
    }
}

} // namespace

Session::Session(Output &output, ProgressLine &progressLine, bool takesAnyBare,
                 std::filesystem::path startFolder)
    : output_(output), progressLine_(progressLine), takesAnyBare_(takesAnyBare),
      startFolder_(std::move(startFolder)),
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
            const upath root = findRoot(factory_, takesAnyBare_, interactor_);
            adapter_ = factory_.createAdapterFor(root, interactor_);
        }
        // Each guard that has ended, those of the search too, took the merge drivers away.
        guard_.emplace();
    }
    return *adapter_;
}

bool Session::hasAdapter() const noexcept
{
    return adapter_ != nullptr;
}

CMAdapter &Session::workingCopy()
{
    CMAdapter &found = adapter();
    const std::filesystem::path root = nativePath(found.getRootFolder());
    if (!hasGitEntry(root))
    {
        throw ShellFailure(
            say("%1% is a bare repository, which has no files. Work in a clone of it.",
                quoteName(makePath(root).string())));
    }
    return found;
}

const std::filesystem::path &Session::startFolder() const noexcept
{
    return startFolder_;
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
