// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include "options/CheckoutCallbacks.hpp"
#include "options/ProxyCallbacks.hpp"
#include "options/RemoteCallbacks.hpp"
#include "options/ReservedCallbacks.hpp"
#include "vclink/ApplicationInteractor.hpp"

namespace vclink::git
{

/// The callback sets of one adapter or generator. libgit2's records point at the sets, so the
/// object outlives every call that such a record is given to.
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

/// The sets that adapters and generators run with. Their pollers are connected to the host's source
/// of cancellation from now until the end of the object.
/// @param interactor not null
[[nodiscard]] std::unique_ptr<GitCallbacks>
makeDefaultGitCallbacks(std::shared_ptr<ApplicationInteractor> interactor);

} // namespace vclink::git
