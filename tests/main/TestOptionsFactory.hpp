// SPDX-License-Identifier: MIT
#pragma once

#include <functional>

#include "vclink/git/GitOptionsFactory.hpp"

namespace vclink::test
{

/// A host's own factory, which records when it is asked for options and when it is destroyed.
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
        if (onFetchOptions)
            onFetchOptions();
        return {};
    }
    git::ProxyOptions makeProxyOptions() override
    {
        if (onProxyOptions)
            onProxyOptions();
        return {};
    }
    git::PushOptions makePushOptions() override
    {
        if (onPushOptions)
            onPushOptions();
        return pushOptions;
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
        if (onMergeOptions)
            onMergeOptions();
        return {};
    }

    std::function<void()> onCloneOptions;
    git::CloneOptions cloneOptions;
    std::function<void()> onStatusOptions;
    std::function<void()> onCheckoutOptions;
    git::CheckoutOptions checkoutOptions;
    std::function<void()> onMergeOptions;
    std::function<void()> onFetchOptions;
    std::function<void()> onProxyOptions;
    std::function<void()> onPushOptions;
    git::PushOptions pushOptions;
    std::function<void()> onDestruction;
};

} // namespace vclink::test
