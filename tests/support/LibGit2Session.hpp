// SPDX-License-Identifier: MIT
#pragma once

#include "support/HermeticEnvironment.hpp"

namespace vclink::test
{

/// Keeps libgit2 running, for tests that call it, or the layers below the library's guard. No merge
/// driver is registered. Configuration comes from the given environment only.
class LibGit2Session
{
  public:
    explicit LibGit2Session(const HermeticEnvironment &environment);
    LibGit2Session(const LibGit2Session &) = delete;
    LibGit2Session &operator=(const LibGit2Session &) = delete;
    ~LibGit2Session();
};

/// How often libgit2 was started and not yet shut down, as it counts itself.
int countLibGit2Starts();

} // namespace vclink::test
