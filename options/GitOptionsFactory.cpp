// SPDX-License-Identifier: MIT
#include "vclink/git/GitOptionsFactory.hpp"

#include <utility>

namespace vclink::git
{
namespace
{

/// Returns every value as its constructor sets it.
class UninitializedGitOptionsFactory : public GitOptionsFactory
{
  public:
    using GitOptionsFactory::GitOptionsFactory;

    CloneOptions makeCloneOptions() override
    {
        return CloneOptions();
    }
    FetchOptions makeFetchOptions() override
    {
        return FetchOptions();
    }
    ProxyOptions makeProxyOptions() override
    {
        return ProxyOptions();
    }
    PushOptions makePushOptions() override
    {
        return PushOptions();
    }
    CheckoutOptions makeCheckoutOptions() override
    {
        return CheckoutOptions();
    }
    StatusOptions makeStatusOptions() override
    {
        return StatusOptions();
    }
    MergeOptions makeMergeOptions() override
    {
        return MergeOptions();
    }
};

/// Sets nested values; inherits the other four operations.
class DefaultGitOptionsFactory : public UninitializedGitOptionsFactory
{
  public:
    using UninitializedGitOptionsFactory::UninitializedGitOptionsFactory;

    CloneOptions makeCloneOptions() override
    {
        CloneOptions options;
        options.checkoutOptions = makeCheckoutOptions();
        options.fetchOptions = makeFetchOptions();
        return options;
    }
    FetchOptions makeFetchOptions() override
    {
        FetchOptions options;
        options.proxyOptions = makeProxyOptions();
        return options;
    }
    PushOptions makePushOptions() override
    {
        PushOptions options;
        options.proxyOptions = makeProxyOptions();
        return options;
    }
};

} // namespace

GitOptionsFactory::GitOptionsFactory(std::shared_ptr<ApplicationInteractor> interactor)
    : interactor_(std::move(interactor))
{
}

GitOptionsFactory::~GitOptionsFactory() = default;

std::unique_ptr<GitOptionsFactory>
GitOptionsFactory::makeUninitialized(std::shared_ptr<ApplicationInteractor> interactor)
{
    return std::make_unique<UninitializedGitOptionsFactory>(std::move(interactor));
}

std::unique_ptr<GitOptionsFactory>
GitOptionsFactory::makeDefault(std::shared_ptr<ApplicationInteractor> interactor)
{
    return std::make_unique<DefaultGitOptionsFactory>(std::move(interactor));
}

std::shared_ptr<ApplicationInteractor> GitOptionsFactory::getInteractor() const
{
    return interactor_;
}

} // namespace vclink::git
