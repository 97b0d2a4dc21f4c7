// SPDX-License-Identifier: MIT
#include "main/files/StatusCallbacks.hpp"

#include "main/files/mapStatusFlags.hpp"
#include "util/path/paths.hpp"

namespace vclink::git
{
namespace
{

constexpr unsigned int statusWord = 0xFFFF;

} // namespace

StatusCallbacks::StatusCallbacks(const upath &walkRoot) : root(walkRoot)
{
}

int StatusCallbacks::status(const char *path, unsigned int flags)
{
    // libgit2 reports in byte order, which is nearly the map's order. So the end is usually the
    // place of the path; a wrong guess costs a look-up.
    states.emplace_hint(states.end(), joinRepositoryPath(root, path, nameBuffer_),
                        FileState(mapStatusFlags(flags & statusWord)));
    return 0;
}

} // namespace vclink::git
