// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/git/GitAttribute.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// Reads the Git attributes of the files of one working copy. Each query opens the repository and
/// sees the current attribute files. Use it on one thread at a time, the adapter's.
class VCLINK_GIT_EXPORT GitAttributes
{
  public:
    /// Creates a reader for the adapter's working copy. Ignores a failure of git_attr_cache_flush.
    /// @param adapter must be from GitAdapterFactory, and must outlive the object
    /// @throws std::bad_cast for any other adapter
    /// @throws LibGit2Exception if the repository cannot be opened
    [[nodiscard]] static std::unique_ptr<GitAttributes> create(vclink::CMAdapter &adapter);

    GitAttributes() = default;
    GitAttributes(const GitAttributes &) = delete;
    GitAttributes &operator=(const GitAttributes &) = delete;
    virtual ~GitAttributes();

    /// Returns the value of an attribute for a file. The attribute files of the working tree count
    /// before those of the index. `name=` without a text counts as set. git_attr_get.
    /// @param path relative to the root of the working tree; the file need not exist
    /// @param name the attribute's name
    /// @throws LibGit2Exception, with GIT_EINVALIDSPEC for a path or name with a NUL character
    /// @throws GitException with the message shared_vclink::git::InvalidGitAttributeValue if
    /// libgit2 returns an unknown kind
    virtual GitAttribute getAttribute(const upath &path, const ustring &name) = 0;
};

} // namespace vclink::git
