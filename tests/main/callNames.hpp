// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

namespace vclink::test
{

/// Functions in the order in which they were called.
using CallNames = std::vector<std::string>;

/// The calls of the query that comes before files are staged or reverted. The index shows where
/// patterns of ignored files are, before libgit2 reads them.
inline const CallNames ofTheQuery{"git_status_options_init", "git_repository_open_ext",
                                  "git_repository_index",    "git_index_free",
                                  "git_status_foreach_ext",  "git_repository_free"};

/// The calls of the look at settings, before an operation that converts files changes anything.
inline const CallNames ofTheSettings{"git_repository_config", "git_config_get_mapped",
                                     "git_config_get_mapped", "git_config_get_mapped",
                                     "git_config_get_mapped", "git_config_free"};

inline CallNames operator+(CallNames left, const CallNames &right)
{
    left.insert(left.end(), right.begin(), right.end());
    return left;
}

} // namespace vclink::test
