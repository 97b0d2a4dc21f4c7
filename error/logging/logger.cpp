// SPDX-License-Identifier: MIT
#include "error/logging/logger.hpp"

namespace vclink::git::detail
{

Logger makeLogger()
{
    return Logger("vclink::git");
}

} // namespace vclink::git::detail
