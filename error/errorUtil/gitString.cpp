// SPDX-License-Identifier: MIT
#include "error/errorUtil/gitString.hpp"

#include <git2/errors.h>

#include "error/errorUtil/libgit2Errors.hpp"
#include "fl/i18n/convert.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace vclink::git
{
namespace
{

std::string showNuls(const std::string &text)
{
    std::string shown;
    for (const char character : text)
    {
        shown += character == '\0' ? std::string("\\0") : std::string(1, character);
    }
    return shown;
}

} // namespace

void refuseNul(const std::string &text)
{
    if (text.find('\0') != std::string::npos)
    {
        const std::string reason = "'" + showNuls(text) + "' contains a NUL character";
        git_error_set_str(GIT_ERROR_INVALID, reason.c_str());
        throw LibGit2Exception(GitError(GIT_EINVALIDSPEC));
    }
}

const char *asGitString(const std::string &text)
{
    refuseNul(text);
    return text.c_str();
}

std::string toGitString(const ustring &text)
{
    std::string converted = fl::i18n::ustring_to_utf8(text);
    refuseNul(converted);
    return converted;
}

} // namespace vclink::git
