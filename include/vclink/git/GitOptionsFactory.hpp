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

/// Creates the option values of the operations. A host that needs other values for clones derives
/// from it and passes it to GitWorkingCopyGenerator, which asks it for the CloneOptions. Adapters
/// always use makeDefault(). The order of the virtual operations is part of the binary interface.
/// The two factories provided here hold nothing that changes, and throw only std::bad_alloc.
class VCLINK_GIT_EXPORT GitOptionsFactory
{
  public:
    /// Keeps the interactor.
    /// @param interactor shared for the factory's life
    explicit GitOptionsFactory(std::shared_ptr<ApplicationInteractor> interactor);
    GitOptionsFactory(const GitOptionsFactory &) = delete;
    GitOptionsFactory &operator=(const GitOptionsFactory &) = delete;
    virtual ~GitOptionsFactory();

    /// Creates a factory that leaves nested values as the constructor of the outer value sets them.
    [[nodiscard]] static std::unique_ptr<GitOptionsFactory>
    makeUninitialized(std::shared_ptr<ApplicationInteractor> interactor);
    /// Creates the factory that adapters use. It sets each nested value to what its operation for
    /// that value returns.
    [[nodiscard]] static std::unique_ptr<GitOptionsFactory>
    makeDefault(std::shared_ptr<ApplicationInteractor> interactor);

    /// Returns the options for a clone.
    virtual CloneOptions makeCloneOptions() = 0;
    /// Returns the options for a fetch.
    virtual FetchOptions makeFetchOptions() = 0;
    /// Returns the options for a listing of a remote, and those that other values nest.
    virtual ProxyOptions makeProxyOptions() = 0;
    /// Returns the options for a push.
    virtual PushOptions makePushOptions() = 0;
    /// Returns the options for a checkout.
    virtual CheckoutOptions makeCheckoutOptions() = 0;
    /// Returns the options for a walk over the states of files.
    virtual StatusOptions makeStatusOptions() = 0;
    /// Returns the options for a merge.
    virtual MergeOptions makeMergeOptions() = 0;

    /// Returns the interactor.
    std::shared_ptr<ApplicationInteractor> getInteractor() const;

  private:
    std::shared_ptr<ApplicationInteractor> interactor_;
};

} // namespace vclink::git
