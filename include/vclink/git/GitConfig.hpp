// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <memory>
#include <optional>

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// Reads and writes the host's merge and diff tools in the user's global Git configuration. Uses
/// the user's XDG file if it exists, otherwise `.gitconfig` in the home folder, which the first
/// write creates. If both exist, git prefers a value in `.gitconfig` to the written one. Holds a
/// LibGit2Guard. Use it on one thread at a time.
class VCLINK_GIT_EXPORT GitConfig
{
  public:
    /// Opens the configuration. git_config_open_default, git_config_open_global.
    /// @throws LibGit2Exception if libgit2 finds no place for the global level, or cannot read a
    /// file
    GitConfig();
    GitConfig(const GitConfig &) = delete;
    GitConfig &operator=(const GitConfig &) = delete;
    ~GitConfig();

    /// Returns the global configuration file in the home folder, or nothing if it does not exist.
    /// git_config_find_global.
    std::optional<upath> globalFilePath() const;

    /// Returns the value of "merge.vkAutoMerge.driver" in the global file, or nothing if it cannot
    /// be read, for any reason. git_config_get_string_buf.
    std::optional<ustring> readAutoMergeDriver() const;
    /// Returns the value of "mergetool.vkMerge.cmd", as readAutoMergeDriver() does.
    std::optional<ustring> readMergeTool() const;
    /// Returns the value of "difftool.vkDiff.cmd", as readAutoMergeDriver() does.
    std::optional<ustring> readDiffTool() const;

    /// Writes the command of the host's automatic merge tool, bin/lnxhost/vkAutoMerge.sh below the
    /// host's installation folder. Replaces the existing value. git_config_set_string.
    /// @throws LibGit2Exception if the file cannot be written, has several values for the key, or
    /// includes the file that has the value. Then the file is unchanged. The exception does not
    /// name the key.
    void writeAutoMergeDriver();
    /// Writes the command of bin/lnxhost/vkMerge, as writeAutoMergeDriver() does.
    void writeMergeTool();
    /// Writes the command of bin/lnxhost/vkDiff, as writeAutoMergeDriver() does.
    void writeDiffTool();

  private:
    struct Impl;
    std::unique_ptr<Impl, std::function<void(Impl *)>> impl_;
};

} // namespace vclink::git
