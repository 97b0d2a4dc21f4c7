// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <git2/attr.h>
#include <git2/types.h>

namespace vclink::git
{

/// Returns an attribute of a file, from the attribute files of the working tree, then of the index,
/// for git_attr_value. A failure counts as no attribute. git_attr_get.
inline const char *readAttribute(git_repository *repository, const std::string &path,
                                 const char *name)
{
    const char *value = nullptr;
    static_cast<void>(git_attr_get(&value, repository, 0, path.c_str(), name));
    return value;
}

} // namespace vclink::git
