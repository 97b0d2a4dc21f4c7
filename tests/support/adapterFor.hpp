// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <utility>

#include "support/GitRepository.hpp"
#include "support/TestInteractor.hpp"
#include "support/text.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/git/GitAdapterFactory.hpp"

namespace vclink::test
{

/// The library's adapter for a working copy, as a host gets it.
inline std::unique_ptr<CMAdapter>
adapterFor(const GitRepository &repository,
           std::shared_ptr<ApplicationInteractor> interactor = std::make_shared<TestInteractor>())
{
    return git::GitAdapterFactory().createAdapterFor(asPath(repository.path()),
                                                     std::move(interactor));
}

} // namespace vclink::test
