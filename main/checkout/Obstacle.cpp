// SPDX-License-Identifier: MIT
#include "main/checkout/Obstacle.hpp"

#include <git2/errors.h>

#include "error/errorUtil/libgit2Errors.hpp"

namespace vclink::git
{
namespace
{

const char *describe(Standing standing)
{
    switch (standing)
    {
    case Standing::File:
        return "the untracked file ";
    case Standing::Link:
        return "the symbolic link ";
    case Standing::Folder:
        return "the folder ";
    case Standing::Special:
        return "the FIFO, socket or device ";
    case Standing::Nothing:
        break;
    }
    return "";
}

} // namespace

Obstacle inTheWay(const std::string &name, Standing standing)
{
    return {name, describe(standing) + ("'" + name) + "' is in the way of the checkout"};
}

Obstacle inChangedFolder(const std::string &name, Standing standing)
{
    // It can be staged, so it is not necessarily untracked.
    const char *const what = standing == Standing::File ? "the file " : describe(standing);
    return {name, what + ("'" + name) + "' is in a folder that becomes a file"};
}

Obstacle stagedChangesOf(const std::string &name)
{
    return {name, "the staged changes of '" + name + "' would be lost in the checkout"};
}

Obstacle editBeforeMerge(const std::string &name)
{
    return {name, "the uncommitted changes of '" + name + "' would be lost in the merge"};
}

Obstacle unreadableFile(const std::string &name)
{
    return {name, "'" + name + "' cannot be read, and its changes would be lost in the checkout"};
}

int reportConflict(const Obstacle &obstacle)
{
    git_error_set_str(GIT_ERROR_CHECKOUT, obstacle.text.c_str());
    return GIT_ECONFLICT;
}

} // namespace vclink::git
