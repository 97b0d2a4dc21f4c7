// SPDX-License-Identifier: MIT
#include "error/errorUtil/raiseSystemError.hpp"

#include <system_error>

#include "error/errorUtil/raiseGitError.hpp"

namespace vclink::git
{

void raiseSystemError(int error, const std::string &text, int errorClass)
{
    const std::string reason = std::generic_category().message(error);
    raiseGitError(GIT_ERROR, errorClass, text + ": " + reason);
}

} // namespace vclink::git
