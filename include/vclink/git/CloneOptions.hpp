// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <boost/optional/optional.hpp>

#include "vclink/git/CheckoutOptions.hpp"
#include "vclink/git/FetchOptions.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// Options for a clone. A plain value.
class VCLINK_GIT_EXPORT CloneOptions
{
  public:
    CloneOptions();

    /// True to create a repository without a working tree. False by default.
    bool bare;
    /// The branch to check out, UTF-8. The remote's default branch if empty.
    boost::optional<std::string> checkoutBranch;
    /// Options for the files.
    CheckoutOptions checkoutOptions;
    /// Options for the transfer.
    FetchOptions fetchOptions;
};

} // namespace vclink::git
