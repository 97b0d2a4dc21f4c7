// SPDX-License-Identifier: MIT
#include "util/repository/settings.hpp"

#include <git2/config.h>
#include <git2/errors.h>

#include "error/errorUtil/GitResult.hpp"

namespace vclink::git
{

bool isSet(git_config *config, const char *setting)
{
    int value = 0;
    const GitResult<void> found = call(git_config_get_bool, &value, config, setting);
    if (found.has_error() && found.error().getCode() == GIT_ENOTFOUND)
    {
        return false;
    }
    check(found);
    return value != 0;
}

} // namespace vclink::git
