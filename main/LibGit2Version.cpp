// SPDX-License-Identifier: MIT
#include "vclink/git/LibGit2Version.hpp"

#include <array>
#include <cstdio>

#include <git2/common.h>

namespace vclink::git
{
namespace
{

std::string toDecimal(int number)
{
    std::array<char, 16> buffer{};
    std::snprintf(buffer.data(), buffer.size(), "%d", number);
    return buffer.data();
}

} // namespace

LibGit2Version::LibGit2Version() : major_(-1), minor_(-1), revision_(-1)
{
    git_libgit2_version(&major_, &minor_, &revision_);
}

int LibGit2Version::getMajor() const noexcept
{
    return major_;
}

int LibGit2Version::getMinor() const noexcept
{
    return minor_;
}

int LibGit2Version::getRevision() const noexcept
{
    return revision_;
}

std::string LibGit2Version::toString() const
{
    return toDecimal(major_) + "." + toDecimal(minor_) + "." + toDecimal(revision_);
}

} // namespace vclink::git
