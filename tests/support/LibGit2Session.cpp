// SPDX-License-Identifier: MIT
#include "support/LibGit2Session.hpp"

#include <stdexcept>

#include <git2.h>

namespace vclink::test
{

LibGit2Session::LibGit2Session(const HermeticEnvironment &environment)
{
    if (git_libgit2_init() < 0)
        throw std::runtime_error("libgit2 can't be started");
    environment.isolateLibGit2();
}

LibGit2Session::~LibGit2Session()
{
    git_libgit2_shutdown();
}

int countLibGit2Starts()
{
    const int count = git_libgit2_init() - 1;
    git_libgit2_shutdown();
    return count;
}

} // namespace vclink::test
