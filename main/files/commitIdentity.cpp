// SPDX-License-Identifier: MIT
#include "main/files/commitIdentity.hpp"

#include <cerrno>
#include <cstdlib>
#include <string>
#include <utility>

#include <boost/asio/ip/host_name.hpp>
#include <git2/errors.h>
#include <git2/signature.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/raise.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::git
{
namespace
{

std::string findUserName()
{
    const char *name = std::getenv("USER");
    if (name == nullptr)
    {
        name = std::getenv("LOGNAME");
    }
    if (name == nullptr)
    {
        raise(shared_vclink::git::NoUserName());
    }
    return name;
}

std::string findHostName()
{
    // A failure without an errno means a machine without a name, so clear an earlier errno.
    errno = 0;
    return boost::asio::ip::host_name();
}

} // namespace

OwnedHandle<git_signature> makeSignature(git_repository *repository)
{
    auto signature = acquire<git_signature>(git_signature_default, repository);
    if (signature.has_error() && signature.error().getCode() == GIT_ENOTFOUND)
    {
        return makeFallbackSignature();
    }
    return std::move(signature).value();
}

OwnedHandle<git_signature> makeFallbackSignature()
{
    const std::string name = findUserName();
    const std::string email = name + "@" + findHostName();
    return acquire<git_signature>(git_signature_now, name.c_str(), email.c_str()).value();
}

} // namespace vclink::git
