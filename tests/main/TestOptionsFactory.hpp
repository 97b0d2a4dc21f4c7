// SPDX-License-Identifier: MIT
#pragma once

#include <functional>

#include "vclink/git/GitOptionsFactory.hpp"

namespace vclink::test
{

/// A host's own factory, which tells when it is asked for the options of a clone, a status walk or
/// a checkout and when it goes.
class TestOptionsFactory : public git::GitOptionsFactory
{
  public:
    using GitOptionsFactory::GitOptionsFactory;
    ~TestOptionsFactory() override
    {
        if (onDestruction)
            onDestruction();
    }
    git::CloneOptions makeCloneOptions() override
    {
        if (onCloneOptions)
            onCloneOptions();
        return cloneOptions;
    }
    git::FetchOptions makeFetchOptions() override
    {
        return {};
    }
    git::ProxyOptions makeProxyOptions() override
    {
        return {};
    }
    git::PushOptions makePushOptions() override
    {
        return {};
    }
    git::CheckoutOptions makeCheckoutOptions() override
    {
        if (onCheckoutOptions)
            onCheckoutOptions();
        return checkoutOptions;
    }
    git::StatusOptions makeStatusOptions() override
    {
        if (onStatusOptions)
            onStatusOptions();
        return {};
    }
    git::MergeOptions makeMergeOptions() override
    {
        return {};
    }

    std::function<void()> onCloneOptions;
    git::CloneOptions cloneOptions;
    std::function<void()> onStatusOptions;
    std::function<void()> onCheckoutOptions;
    git::CheckoutOptions checkoutOptions;
    std::function<void()> onDestruction;
};

} // namespace vclink::test
