// SPDX-License-Identifier: MIT
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/CMAdapterFactory.hpp"
#include "vclink/ProgressReporter.hpp"
#include "vclink/WorkingCopyGenerator.hpp"

namespace vclink
{

ApplicationInteractor::~ApplicationInteractor() = default;
CMAdapter::~CMAdapter() = default;
CMAdapterFactory::~CMAdapterFactory() = default;
ProgressReporter::~ProgressReporter() = default;
WorkingCopyGenerator::~WorkingCopyGenerator() = default;

} // namespace vclink
