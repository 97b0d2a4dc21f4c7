// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <string>

#include "support/GitRepository.hpp"

namespace vclink::test
{

/// Paths with contents; "-" takes one away, 40 digits are the commit of a submodule.
using Files = std::map<std::string, std::string>;

/// One commit for importCommits(), on top of main's unless it is that.
std::string commitOf(const std::string &branch, const Files &files);

/// Imports branches into an empty repository, and checks main out.
void importCommits(const GitRepository &copy, const std::string &stream);

} // namespace vclink::test
