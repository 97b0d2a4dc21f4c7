// SPDX-License-Identifier: MIT
#include "vclink/git/LibGit2Exception.hpp"

#include <memory>

#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::git
{

LibGit2Exception::LibGit2Exception(const GitError &error)
    : GitException(shared_vclink::git::LibGit2Error(error.getCode(), error.getErrorClass(),
                                                    error.getMessage())),
      error_(error)
{
}

LibGit2Exception::LibGit2Exception(const LibGit2Exception &other) = default;

LibGit2Exception::~LibGit2Exception() noexcept = default;

const LibGit2Exception *LibGit2Exception::clone() const
{
    return std::make_unique<LibGit2Exception>(*this).release();
}

void LibGit2Exception::rethrow() const
{
    throw LibGit2Exception(*this);
}

const GitError &LibGit2Exception::getError() const noexcept
{
    return error_;
}

} // namespace vclink::git
