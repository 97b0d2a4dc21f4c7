// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include <git2/pathspec.h>
#include <git2/strarray.h>
#include <git2/types.h>

namespace vclink::git
{

/// Patterns that are read once.
class ListedFiles
{
  public:
    /// git_pathspec_new.
    /// @param index decides whether case matters
    /// @throws LibGit2Exception
    ListedFiles(git_index *index, const git_strarray &listed);

    /// git_pathspec_matches_path, as libgit2 itself decides what a reset or a checkout is to
    /// change.
    bool contain(const std::string &path) const;

  private:
    std::unique_ptr<git_pathspec, void (*)(git_pathspec *)> pathspec_{nullptr, git_pathspec_free};
    std::uint32_t flags_ = GIT_PATHSPEC_DEFAULT;
};

} // namespace vclink::git
