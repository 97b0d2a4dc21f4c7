// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include "vclink/ApplicationInteractor.hpp"
#include "vclink/git/CheckoutOptions.hpp"
#include "vclink/git/CloneOptions.hpp"
#include "vclink/git/FetchOptions.hpp"
#include "vclink/git/MergeOptions.hpp"
#include "vclink/git/ProxyOptions.hpp"
#include "vclink/git/PushOptions.hpp"
#include "vclink/git/StatusOptions.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// Makes the option values that the operations run with. A host that wants other values derives
/// from it. The order of the virtual operations is binding. The two factories given here hold
/// nothing that changes, and raise nothing but std::bad_alloc.
class VCLINK_GIT_EXPORT GitOptionsFactory
{
  public:
    /// @param interactor shared for the factory's life
    explicit GitOptionsFactory(std::shared_ptr<ApplicationInteractor> interactor);
    GitOptionsFactory(const GitOptionsFactory &) = delete;
    GitOptionsFactory &operator=(const GitOptionsFactory &) = delete;
    virtual ~GitOptionsFactory();

    /// A factory that leaves nested values as their outer value's constructor made them.
    [[nodiscard]] static std::unique_ptr<GitOptionsFactory>
    makeUninitialized(std::shared_ptr<ApplicationInteractor> interactor);
    /// A factory that composes nested values of their own defaults; what adapters run with.
    [[nodiscard]] static std::unique_ptr<GitOptionsFactory>
    makeDefault(std::shared_ptr<ApplicationInteractor> interactor);

    /// For a clone.
    virtual CloneOptions makeCloneOptions() = 0;
    /// For a fetch.
    virtual FetchOptions makeFetchOptions() = 0;
    /// For a listing of a remote, and what others nest.
    virtual ProxyOptions makeProxyOptions() = 0;
    /// For a push.
    virtual PushOptions makePushOptions() = 0;
    /// For a checkout.
    virtual CheckoutOptions makeCheckoutOptions() = 0;
    /// For a walk over the states of files.
    virtual StatusOptions makeStatusOptions() = 0;
    /// For a merge.
    virtual MergeOptions makeMergeOptions() = 0;

    /// A further share of the interactor.
    std::shared_ptr<ApplicationInteractor> getInteractor() const;

  private:
    std::shared_ptr<ApplicationInteractor> interactor_;
};

} // namespace vclink::git
