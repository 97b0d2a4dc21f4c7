// SPDX-License-Identifier: MIT
#pragma once

#include <vector>

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"
#include "vclink/FileStateMap.hpp"
#include "vclink_host/export.hpp"

namespace vclink
{

/// The operations of a source-control back end on one working copy. The order of the operations is
/// binding. A failure is an exception.
class VCLINK_HOST_EXPORT CMAdapter
{
  public:
    CMAdapter() = default;
    CMAdapter(const CMAdapter &) = delete;
    CMAdapter &operator=(const CMAdapter &) = delete;
    virtual ~CMAdapter();

    virtual void commit(const upath &folder, const ustring &message) = 0;
    virtual void addFiles(const std::vector<upath> &files) = 0;
    virtual void removeFiles(const std::vector<upath> &files) = 0;
    virtual void revertFiles(const std::vector<upath> &files) = 0;
    virtual void markResolved(const upath &file) = 0;
    virtual FileStateMap getFileStates(const std::vector<upath> &files) = 0;
    virtual FileStateMap getFolderStates(const upath &folder) = 0;
    virtual const upath &getRootFolder() = 0;
};

} // namespace vclink
