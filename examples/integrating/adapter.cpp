// SPDX-License-Identifier: MIT
#include <memory>

#include "fl/filesystem/path.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/GitRemote.hpp"

void fetchAndMerge(const upath &folder,
                   const std::shared_ptr<vclink::ApplicationInteractor> &interactor)
{
    const vclink::git::GitAdapterFactory factory;
    const auto adapter = factory.createAdapterFor(folder, interactor);
    const auto remote = vclink::git::GitRemote::create("origin", *adapter);
    const auto branches = vclink::git::BranchManager::create(*adapter);
    remote->fetch({});
    branches->merge("origin/main");
}
