// SPDX-License-Identifier: MIT
#include "Rescue.hpp"

#include <system_error>
#include <utility>

#include "hostTools.hpp"

namespace vclink::desktop
{
namespace
{

namespace fs = std::filesystem;

constexpr auto everything = fs::copy_options::recursive | fs::copy_options::copy_symlinks;

FileState stateOf(const FileStateMap &states, const upath &path)
{
    const auto found = states.find(path);
    return found == states.end() ? FileState(FileState::Unknown) : found->second;
}

} // namespace

Rescue::Rescue(fs::path folder, CMAdapter &adapter, const std::vector<upath> &files)
    : folder_(std::move(folder)), root_(adapter.getRootFolder())
{
    const FileStateMap states = host_tools::readStates(adapter);
    fs::create_directories(folder_);
    fs::permissions(folder_, fs::perms::owner_all);
    for (const auto &path : files)
    {
        const fs::path source = host_tools::toStdPath(path);
        std::error_code error;
        // "Not a directory": a file is where the path has a folder.
        const bool exists = fs::exists(fs::symlink_status(source, error));
        files_.push_back({path, stateOf(states, path), exists});
        if (exists)
        {
            const fs::path copy = copyOf(files_.back());
            fs::create_directories(copy.parent_path());
            fs::copy(source, copy, everything);
        }
    }
}

fs::path Rescue::copyOf(const Kept &kept) const
{
    return folder_ / fl::i18n::ustring_to_utf8(host_tools::relativeName(kept.path, root_));
}

std::vector<upath> Rescue::putBack(CMAdapter &adapter) const
{
    const FileStateMap states = host_tools::readStates(adapter);
    std::vector<upath> left;
    std::vector<upath> added;
    for (const auto &kept : files_)
    {
        const fs::path place = host_tools::toStdPath(kept.path);
        const bool wasAdded = kept.state.getState() == FileState::Added;
        const auto expected = wasAdded ? FileState::Unversioned : FileState::Clean;
        if (stateOf(states, kept.path).getState() != expected)
            left.push_back(kept.path);
        else if (wasAdded)
            added.push_back(kept.path);
        else if (kept.hasCopy)
        {
            fs::remove(place);
            fs::copy(copyOf(kept), place, everything);
        }
        else
            fs::remove(place);
    }
    if (!added.empty())
        adapter.addFiles(added);
    return left;
}

} // namespace vclink::desktop
