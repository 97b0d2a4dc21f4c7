// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <boost/optional/optional.hpp>

#include "vclink/git/CheckoutOptions.hpp"
#include "vclink/git/FetchOptions.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// What a clone is told. A plain value.
class VCLINK_GIT_EXPORT CloneOptions
{
  public:
    CloneOptions();

    /// Whether to make a repository without a working tree; false at the start.
    bool bare;
    /// The branch to check out, UTF-8; the remote's default branch when empty.
    boost::optional<std::string> checkoutBranch;
    /// For the files.
    CheckoutOptions checkoutOptions;
    /// For the transfer.
    FetchOptions fetchOptions;
};

} // namespace vclink::git
