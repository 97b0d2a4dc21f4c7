// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "LibGit2Faults.hpp"

namespace vclink::test
{

/// One fault, and what it hits.
struct FaultSite
{
    std::string operation;
    /// the function of libgit2, and the how manieth call of it in the operation
    std::string function;
    int occurrence = 0;
    LibGit2Fault fault;
};

/// Whether the library does not look at the function's code, so that a call that did nothing can't
/// be told from one that worked.
bool isUnexamined(const std::string &operation, const std::string &function);

/// How the operation ends with the fault.
/// @param normal how it ends without
std::string expectedOutcome(const FaultSite &site, const std::string &normal);

} // namespace vclink::test
