// SPDX-License-Identifier: MIT
#pragma once

#include <string>

namespace vclink::git
{

/// Asks for each folder above a name, from the top: "a" and "a/b" for "a/b/c".
/// @param name relative, with forward slashes
/// @param is takes a name without a slash at its end
/// @return whether it is true of one; then the folders below are not asked for
template <class Predicate> bool anyFolderAbove(const std::string &name, const Predicate &is)
{
    for (auto end = name.find('/'); end != std::string::npos; end = name.find('/', end + 1))
    {
        if (is(name.substr(0, end)))
        {
            return true;
        }
    }
    return false;
}

/// Returns true if a folder above the name is a symbolic link.
/// @param root with a slash at its end
bool hasLinkAbove(const std::string &root, const std::string &name);

} // namespace vclink::git
