// SPDX-License-Identifier: MIT
#include <memory>
#include <vector>

#include "fl/filesystem/path.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/git/GitAdapterFactory.hpp"

void commitNewFiles(const upath &folder, const std::vector<upath> &newFiles,
                    const std::shared_ptr<vclink::ApplicationInteractor> &interactor)
{
    const vclink::git::GitAdapterFactory factory;
    if (!factory.isAdapterFor(folder))
        return;
    const auto adapter = factory.createAdapterFor(folder, interactor);
    adapter->addFiles(newFiles);
    adapter->commit(folder, u"Begin the chapter on birds");
}
