// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include "options/CheckoutCallbacks.hpp"
#include "options/RemoteCallbacks.hpp"
#include "vclink/ApplicationInteractor.hpp"

namespace vclink::git
{

/// A set without callbacks, for its place in GitCallbacks.
class ReservedCallbacks
{
  public:
    /// @param interactor outlives the set
    explicit ReservedCallbacks(ApplicationInteractor &interactor) : interactor_(interactor)
    {
    }

  private:
    [[maybe_unused]] ApplicationInteractor &interactor_;
};

/// A set without callbacks: libgit2 never asks about a proxy.
class ProxyCallbacks
{
};

/// The callback sets of one adapter or generator. libgit2's records point to the sets, so the
/// object outlives every call with such a record.
class GitCallbacks
{
  public:
    /// @param interactor shared for the object's life
    explicit GitCallbacks(std::shared_ptr<ApplicationInteractor> interactor);
    GitCallbacks(const GitCallbacks &) = delete;
    GitCallbacks &operator=(const GitCallbacks &) = delete;
    virtual ~GitCallbacks();

    virtual RemoteCallbacks &remoteCallbacks() = 0;
    virtual ReservedCallbacks &reservedCallbacks() = 0;
    virtual CheckoutCallbacks &checkoutCallbacks() = 0;
    virtual ProxyCallbacks &proxyCallbacks() = 0;

  protected:
    ApplicationInteractor &interactor() noexcept;

  private:
    std::shared_ptr<ApplicationInteractor> interactor_;
};

/// Returns the sets that adapters and generators use. Their pollers are connected to the host's
/// source of cancellation until the end of the object.
/// @param interactor not null
[[nodiscard]] std::unique_ptr<GitCallbacks>
makeDefaultGitCallbacks(std::shared_ptr<ApplicationInteractor> interactor);

} // namespace vclink::git
