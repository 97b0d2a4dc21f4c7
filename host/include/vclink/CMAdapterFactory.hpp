// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/WorkingCopyGenerator.hpp"
#include "vclink_host/export.hpp"

namespace vclink
{

/// The entry to a back end. The order of the operations is binding.
class VCLINK_HOST_EXPORT CMAdapterFactory
{
  public:
    CMAdapterFactory() = default;
    CMAdapterFactory(const CMAdapterFactory &) = delete;
    CMAdapterFactory &operator=(const CMAdapterFactory &) = delete;
    virtual ~CMAdapterFactory();

    virtual std::unique_ptr<CMAdapter>
    createAdapterFor(const upath &root,
                     std::shared_ptr<ApplicationInteractor> interactor) const = 0;
    virtual std::unique_ptr<WorkingCopyGenerator>
    createWorkingCopyGenerator(std::shared_ptr<ApplicationInteractor> interactor) const = 0;
    virtual bool isAdapterFor(const upath &folder) const = 0;
    virtual ustring getName() const = 0;
};

} // namespace vclink
