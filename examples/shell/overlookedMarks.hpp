// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <set>
#include <string>

namespace vclink::shell
{

/// The marks "assume unchanged" and "skip worktree" of files on the disk. The back end writes the
/// entries of reverted files again, without them.
class OverlookedMarks
{
  public:
    /// Reads the marks. Without git there are none.
    explicit OverlookedMarks(std::filesystem::path root);

    /// Sets marks again that are gone now, and names the files if that fails.
    void restore() const;

  private:
    struct Names
    {
        std::set<std::string> assumedUnchanged;
        std::set<std::string> skipped;
    };

    Names read() const;

    std::filesystem::path root_;
    Names before_;
};

} // namespace vclink::shell
