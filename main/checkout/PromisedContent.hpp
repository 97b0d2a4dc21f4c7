// SPDX-License-Identifier: MIT
#pragma once

#include <string_view>

#include <git2/oid.h>
#include <git2/types.h>

#include "error/errorUtil/OwnedHandle.hpp"
#include "main/checkout/Obstacle.hpp"

namespace vclink::git
{

/// The file contents that a partial clone lacks, because git fetches them when it needs them.
/// libgit2 fetches none, and would find that out in the middle of its writing.
class PromisedContent
{
  public:
    /// git_repository_odb, for a partial clone.
    /// @throws LibGit2Exception
    explicit PromisedContent(git_repository *repository);

    /// Finds a file whose content the clone lacks. git_odb_exists.
    Finding find(std::string_view path, const git_oid &id) const
    {
        return database_ == nullptr ? Finding() : look(path, id);
    }

  private:
    Finding look(std::string_view path, const git_oid &id) const;

    /// null unless this is a partial clone
    OwnedHandle<git_odb> database_;
};

} // namespace vclink::git
