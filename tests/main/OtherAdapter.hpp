// SPDX-License-Identifier: MIT
#pragma once

#include <vector>

#include "vclink/CMAdapter.hpp"

namespace vclink::test
{

/// An adapter of another back end, which does nothing.
class OtherAdapter : public vclink::CMAdapter
{
  public:
    void commit(const upath &, const ustring &) override
    {
    }
    void addFiles(const std::vector<upath> &) override
    {
    }
    void removeFiles(const std::vector<upath> &) override
    {
    }
    void revertFiles(const std::vector<upath> &) override
    {
    }
    void markResolved(const upath &) override
    {
    }
    vclink::FileStateMap getFileStates(const std::vector<upath> &) override
    {
        return {};
    }
    vclink::FileStateMap getFolderStates(const upath &) override
    {
        return {};
    }
    const upath &getRootFolder() override
    {
        return root_;
    }

  private:
    upath root_;
};

} // namespace vclink::test
