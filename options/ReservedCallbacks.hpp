// SPDX-License-Identifier: MIT
#pragma once

#include "vclink/ApplicationInteractor.hpp"

namespace vclink::git
{

/// A set without callbacks, which keeps its place in GitCallbacks.
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

} // namespace vclink::git
