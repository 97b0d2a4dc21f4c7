// SPDX-License-Identifier: MIT
#include "ChangeModel.hpp"

#include <filesystem>
#include <set>
#include <utility>

#include "listedNames.hpp"
#include "moves.hpp"
#include "quoting.hpp"
#include "support/text.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

bool isIndexed(const GitFile &file)
{
    return file.unmerged || file.indexMode != noMode;
}

/// Whether the working tree is not what the index has.
bool isChanged(const GitFile &file)
{
    return file.unmerged || file.untracked || file.workTree != '.';
}

} // namespace

ChangeModel::ChangeModel(GitRepository repository) : repository_(std::move(repository))
{
}

std::string ChangeModel::add(const Names &names)
{
    Names toAdd;
    Names refused;
    for (const auto &[path, state] : statesOf(names))
    {
        (state == FileState::Unversioned ? toAdd : refused).push_back(path);
    }
    if (!refused.empty())
    {
        return refuse("AlreadyAdded", refused);
    }
    stage(meantBy(toAdd, isChanged));
    return {};
}

std::string ChangeModel::remove(const Names &names)
{
    Names toRemove;
    for (const auto &[path, state] : statesOf(names))
    {
        if (state != FileState::Deleted)
        {
            toRemove.push_back(path);
        }
    }
    if (toRemove.empty())
    {
        return refuse("NoFilesToRemove", {});
    }
    unstage(meantBy(toRemove, isIndexed));
    return {};
}

std::string ChangeModel::revert(const Names &names)
{
    Names conflicted;
    for (const auto &[path, state] : statesOf(names))
    {
        if (state == FileState::InConflict)
        {
            conflicted.push_back(path);
        }
    }
    if (!conflicted.empty())
    {
        return refuse("Conflicted", conflicted);
    }
    const Names staged = meantBy(names, [](const GitFile &file) { return file.index != '.'; });
    if (!staged.empty())
    {
        run({"--literal-pathspecs", "reset", "--quiet", "--pathspec-from-file=-",
             "--pathspec-file-nul"},
            staged);
    }
    run({"checkout-index", "--force", "--quiet", "-z", "--stdin"},
        meantBy(names,
                [](const GitFile &file)
                {
                    const bool unchanged = file.index == '.' && isIndexed(file);
                    return unchanged || file.headMode != noMode;
                }));
    return {};
}

std::string ChangeModel::markResolved(const std::string &name)
{
    if (fs::exists(repository_ / name))
    {
        stage(meantBy({name}, isChanged));
    }
    else
    {
        unstage(meantBy({name}, isIndexed));
    }
    return {};
}

std::string ChangeModel::commit(const std::string &message)
{
    repository_
        .command({"commit", "--quiet", "--all", "--allow-empty", "--allow-empty-message",
                  "--no-verify", "--cleanup=verbatim", "--file=-"})
        .input(message)
        .runOrThrow();
    return {};
}

void ChangeModel::refresh()
{
    index_ = listIndex(repository_);
    refreshStatus();
}

void ChangeModel::refreshStatus()
{
    status_ = runGitStatus(repository_);
    report_ = readGitReport(repository_, status_, index_);
}

States ChangeModel::states()
{
    return statesWhere([](const std::string &) { return true; });
}

States ChangeModel::statesOf(const Names &names)
{
    const Names resolved = resolveNames(repository_.path(), names);
    return statesWhere([&resolved](const std::string &path) { return isMeant(path, resolved); });
}

States ChangeModel::statesWhere(const std::function<bool(const std::string &path)> &isAsked)
{
    Names unknown;
    for (auto &id : moveCandidates(report_))
    {
        if (blobs_.count(id) == 0)
        {
            unknown.push_back(std::move(id));
        }
    }
    blobs_.merge(readBlobs(repository_, unknown));
    return expectedStates(report_, blobs_, isAsked);
}

std::string ChangeModel::refuse(const std::string &key, const Names &paths) const
{
    // In the order of the host's paths.
    std::set<upath> sorted;
    for (const auto &path : paths)
    {
        sorted.insert(asPath(path));
    }
    std::string text = key;
    for (const auto &path : sorted)
    {
        text += '\n' + asBytes(path);
    }
    return text;
}

Names ChangeModel::meantBy(const Names &names,
                           const std::function<bool(const GitFile &file)> &isWanted) const
{
    Names paths;
    const Names resolved = resolveNames(repository_.path(), names);
    for (const auto &[path, file] : report_)
    {
        if (isMeant(path, resolved) && isWanted(file))
        {
            paths.push_back(path);
        }
    }
    return paths;
}

void ChangeModel::run(const std::vector<std::string> &arguments, const Names &paths) const
{
    repository_.command(arguments).input(joinWithNul(paths)).runOrThrow();
}

/// As `git add` does, also where a folder has taken the place of a file in conflict: that one
/// `git update-index` refuses, which takes any other such file for deleted.
void ChangeModel::stage(const Names &paths) const
{
    Names gone;
    Names others;
    for (const auto &path : paths)
    {
        const auto file = report_.find(path);
        const bool isUnmerged = file != report_.end() && file->second.unmerged;
        const bool isFolder = fs::is_directory(fs::symlink_status(repository_ / path));
        (isUnmerged && isFolder ? gone : others).push_back(path);
    }
    unstage(gone);
    run({"update-index", "-z", "--add", "--remove", "--replace", "--stdin"}, others);
}

void ChangeModel::unstage(const Names &paths) const
{
    run({"update-index", "-z", "--force-remove", "--stdin"}, paths);
}

} // namespace vclink::test
