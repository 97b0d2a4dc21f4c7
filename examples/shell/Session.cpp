// SPDX-License-Identifier: MIT
#include "Session.hpp"

#include <filesystem>
#include <string>
#include <system_error>

#include "failures.hpp"
#include "names.hpp"

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

/// The back end serves the very root of a working copy, so the search upwards is the host's.
upath findRoot(const CMAdapterFactory &factory)
{
    const std::filesystem::path start = currentFolder();
    for (std::filesystem::path folder = start;; folder = folder.parent_path())
    {
        upath candidate = makePath(folder);
        // A ".git" folder can be opened too, but the files belong to the folder that holds it.
        if (folder.filename() != ".git" && factory.isAdapterFor(candidate))
        {
            return candidate;
        }
        if (!folder.has_relative_path())
        {
            throw ShellFailure(describeSearch(start));
        }
    }
}

} // namespace

Session::Session(Output &output, ProgressLine &progressLine)
    : output_(output), progressLine_(progressLine),
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
            adapter_ = factory_.createAdapterFor(findRoot(factory_), interactor_);
        }
        // Each guard that has ended, those of the search too, took the merge drivers away.
        guard_.emplace();
    }
    return *adapter_;
}

} // namespace vclink::shell
