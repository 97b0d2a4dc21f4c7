// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "support/libgit2/LibGit2Recorder.hpp"

namespace vclink::test
{

/// One call of an operation that fails.
struct FaultSite
{
    std::string operation;
    LibGit2Fault fault;
};

/// Whether the library does not look at the function's code, so that a call that did nothing can't
/// be told from one that worked.
bool isUnexamined(const std::string &operation, const std::string &function);

/// How the operation ends with the fault.
/// @param normal how it ends without
std::string expectedOutcome(const FaultSite &site, const std::string &normal);

} // namespace vclink::test
