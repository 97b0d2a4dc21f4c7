// SPDX-License-Identifier: MIT
#include "options/GitCallbacks.hpp"

#include <utility>

namespace vclink::git
{
namespace
{

class DefaultGitCallbacks : public GitCallbacks
{
  public:
    explicit DefaultGitCallbacks(std::shared_ptr<ApplicationInteractor> shared)
        : GitCallbacks(std::move(shared)), remoteCallbacks_(interactor()),
          reservedCallbacks_(interactor()), checkoutCallbacks_(interactor())
    {
    }

    RemoteCallbacks &remoteCallbacks() override
    {
        return remoteCallbacks_;
    }
    ReservedCallbacks &reservedCallbacks() override
    {
        return reservedCallbacks_;
    }
    CheckoutCallbacks &checkoutCallbacks() override
    {
        return checkoutCallbacks_;
    }
    ProxyCallbacks &proxyCallbacks() override
    {
        return proxyCallbacks_;
    }

  private:
    RemoteCallbacks remoteCallbacks_;
    ReservedCallbacks reservedCallbacks_;
    CheckoutCallbacks checkoutCallbacks_;
    ProxyCallbacks proxyCallbacks_;
};

} // namespace

GitCallbacks::GitCallbacks(std::shared_ptr<ApplicationInteractor> interactor)
    : interactor_(std::move(interactor))
{
}

GitCallbacks::~GitCallbacks() = default;

ApplicationInteractor &GitCallbacks::interactor() noexcept
{
    return *interactor_;
}

std::unique_ptr<GitCallbacks>
makeDefaultGitCallbacks(std::shared_ptr<ApplicationInteractor> interactor)
{
    return std::make_unique<DefaultGitCallbacks>(std::move(interactor));
}

} // namespace vclink::git
