// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <gtest/gtest.h>

#include "support/GitRepository.hpp"

namespace vclink::test
{

/// Runs a script of the shell in a working copy.
inline void runScript(const GitRepository &repository, const std::string &script)
{
    const CommandResult result = Command({"sh", "-ec", script}).in(repository.path()).run();
    ASSERT_TRUE(result.succeeded()) << script << '\n' << result.errors;
}

} // namespace vclink::test
