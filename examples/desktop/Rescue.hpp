// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <vector>

#include "fl/filesystem/path.hpp"
#include "vclink/FileState.hpp"

namespace vclink
{
class CMAdapter;
}

namespace vclink::desktop
{

/// The way back from a revert: copies of the files, in a folder of the user's that stays when the
/// program ends.
class Rescue
{
  public:
    /// Copies what is in the place of each file.
    /// @param folder new, for this revert alone
    /// @throws std::filesystem::filesystem_error; nothing may be reverted then
    Rescue(std::filesystem::path folder, CMAdapter &adapter, const std::vector<upath> &files);

    /// Puts the copies back, and adds again what was added. A file that is not as the revert left
    /// it stays as it is.
    /// @return the files that were left alone
    std::vector<upath> putBack(CMAdapter &adapter) const;

  private:
    struct Kept
    {
        upath path;
        FileState state;
        bool hasCopy;
    };
    std::filesystem::path copyOf(const Kept &kept) const;

    std::filesystem::path folder_;
    upath root_;
    std::vector<Kept> files_;
};

} // namespace vclink::desktop
