// SPDX-License-Identifier: MIT
#pragma once

#include "support/HermeticEnvironment.hpp"
#include "support/LibGit2Session.hpp"
#include "support/TemporaryFolder.hpp"

namespace vclink::test
{

/// libgit2, running for the life of the object in an environment of its own.
class HermeticLibGit2
{
  public:
    const TemporaryFolder &folder() const noexcept
    {
        return folder_;
    }

  private:
    TemporaryFolder folder_;
    HermeticEnvironment environment_{folder_.path()};
    LibGit2Session session_{environment_};
};

} // namespace vclink::test
