// SPDX-License-Identifier: MIT
#include <git2/checkout.h>

#include "vclink/git/CheckoutOptions.hpp"
#include "vclink/git/CloneOptions.hpp"
#include "vclink/git/FetchOptions.hpp"
#include "vclink/git/MergeOptions.hpp"
#include "vclink/git/ProxyOptions.hpp"
#include "vclink/git/PushOptions.hpp"
#include "vclink/git/StatusOptions.hpp"

namespace vclink::git
{

CheckoutOptions::CheckoutOptions() : checkoutStrategy(GIT_CHECKOUT_SAFE)
{
}

CloneOptions::CloneOptions() : bare(false)
{
}

FetchOptions::FetchOptions() = default;

MergeOptions::MergeOptions() = default;

ProxyOptions::ProxyOptions() = default;

PushOptions::PushOptions() : packbuilderParallelism(1)
{
}

StatusOptions::StatusOptions() = default;

} // namespace vclink::git
