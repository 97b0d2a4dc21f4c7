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

/// The host's merge and diff tools in the user's global Git configuration. Works on the file that
/// the first level found has: the user's XDG file where there is one, otherwise `.gitconfig` in the
/// home folder, which the first write makes. Holds a LibGit2Guard. For one thread at a time.
class VCLINK_GIT_EXPORT GitConfig
{
  public:
    /// git_config_open_default, git_config_open_global.
    /// @throws LibGit2Exception when libgit2 finds no place for the global level, or can't read a
    /// file
    GitConfig();
    GitConfig(const GitConfig &) = delete;
    GitConfig &operator=(const GitConfig &) = delete;
    ~GitConfig();

    /// The file of the global level in the home folder; nothing while there is none.
    /// git_config_find_global.
    std::optional<upath> globalFilePath() const;

    /// What stands in the global file under "merge.vkAutoMerge.driver"; nothing when it can't be
    /// read, for whatever reason. git_config_get_string_buf.
    std::optional<ustring> readAutoMergeDriver() const;
    /// The same of "mergetool.vkMerge.cmd".
    std::optional<ustring> readMergeTool() const;
    /// The same of "difftool.vkDiff.cmd".
    std::optional<ustring> readDiffTool() const;

    /// Writes the command of the host's automatic merge tool, bin/lnxhost/vkAutoMerge.sh below the
    /// host's place of installation, and replaces the value that is there. git_config_set_string.
    /// @throws LibGit2Exception if the file cannot be written, or has several values for the key,
    /// or an included one. It is as it was before then. The exception does not name the key.
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
