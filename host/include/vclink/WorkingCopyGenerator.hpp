// SPDX-License-Identifier: MIT
#pragma once

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"
#include "vclink_host/export.hpp"

namespace vclink
{

/// Creates working copies of repositories.
class VCLINK_HOST_EXPORT WorkingCopyGenerator
{
  public:
    WorkingCopyGenerator() = default;
    WorkingCopyGenerator(const WorkingCopyGenerator &) = delete;
    WorkingCopyGenerator &operator=(const WorkingCopyGenerator &) = delete;
    virtual ~WorkingCopyGenerator();

    /// @param repositorySpecifier names the repository in the form that the back end defines
    /// @param sandboxRoot the folder of the new working copy
    virtual void generate(const ustring &repositorySpecifier, const upath &sandboxRoot) = 0;
};

} // namespace vclink
