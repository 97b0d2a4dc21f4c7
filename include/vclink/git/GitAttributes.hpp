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

/// Git's attributes of the files of one working copy. Each query opens the repository anew and sees
/// the attribute files as they then are. For one thread at a time, as its adapter.
class VCLINK_GIT_EXPORT GitAttributes
{
  public:
    /// git_attr_cache_flush, whose failure goes unnoticed.
    /// @param adapter one that GitAdapterFactory has made; must outlive the object
    /// @throws std::bad_cast for any other adapter
    /// @throws LibGit2Exception when the repository can't be opened
    [[nodiscard]] static std::unique_ptr<GitAttributes> create(vclink::CMAdapter &adapter);

    GitAttributes() = default;
    GitAttributes(const GitAttributes &) = delete;
    GitAttributes &operator=(const GitAttributes &) = delete;
    virtual ~GitAttributes();

    /// What the attribute files of the working tree, and then those of the index, say. `name=` with
    /// nothing behind it counts as set. git_attr_get.
    /// @param path relative to the root of the working tree; the file need not exist
    /// @param name the attribute's name
    /// @throws LibGit2Exception, with GIT_EINVALIDSPEC for a path or name with a NUL character;
    /// GitException with the message
    /// shared_vclink::git::InvalidGitAttributeValue for an answer of an unknown kind
    virtual GitAttribute getAttribute(const upath &path, const ustring &name) = 0;
};

} // namespace vclink::git
