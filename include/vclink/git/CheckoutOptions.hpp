// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>

#include "vclink/git/export.hpp"

namespace vclink::git
{

/// Options for a checkout. A plain value.
class VCLINK_GIT_EXPORT CheckoutOptions
{
  public:
    CheckoutOptions();

    /// libgit2's git_checkout_strategy_t flags, in the low 32 bits. GIT_CHECKOUT_SAFE by default.
    std::uint64_t checkoutStrategy;
};

} // namespace vclink::git
