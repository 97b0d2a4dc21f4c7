// SPDX-License-Identifier: MIT
#pragma once

#include "main/files/GitAdapter.hpp"
#include "vclink/git/GitAttributes.hpp"

namespace vclink::git
{

/// The attributes of a GitAdapter's working copy.
class GitAttributesImpl : public GitAttributes
{
  public:
    /// @param adapter outlives the object
    /// @throws LibGit2Exception
    explicit GitAttributesImpl(GitAdapter &adapter);
    ~GitAttributesImpl() override;

    GitAttribute getAttribute(const upath &path, const ustring &name) override;

  private:
    GitAdapter &adapter_;
};

} // namespace vclink::git
