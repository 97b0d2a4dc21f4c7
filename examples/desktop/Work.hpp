// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <memory>
#include <shared_mutex>
#include <string>

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/WorkingCopyGenerator.hpp"
#include "vclink/git/BranchManager.hpp"

namespace vclink::desktop
{

/// What one operation works with, on the worker's thread: an adapter of its own for the working
/// copy.
///
/// Each guard that ends removes the merge driver for the whole process, and adapters, probes and
/// generators hold one. So all of them begin and end while `guards` is locked shared. A merge locks
/// it exclusively, with a guard that begins right before the merge.
class Work
{
  public:
    /// @param guards one for the process; outlives the object
    /// @param attached called when a request to cancel would reach the operation
    Work(std::shared_mutex &guards, upath root, std::shared_ptr<ApplicationInteractor> interactor,
         std::function<void()> attached);
    Work(const Work &) = delete;
    Work &operator=(const Work &) = delete;
    ~Work();

    const upath &root() const noexcept
    {
        return root_;
    }
    /// Made at the first call.
    CMAdapter &adapter();
    std::unique_ptr<git::BranchManager> branches();
    void merge(const std::string &name);
    void clone(const ustring &repository, const upath &folder);

    /// Whether the folder is the root of a repository.
    bool serves(const upath &folder) const;

  private:
    std::shared_mutex &guards_;
    upath root_;
    std::shared_ptr<ApplicationInteractor> interactor_;
    std::function<void()> attached_;
    std::unique_ptr<CMAdapter> adapter_;
    std::unique_ptr<WorkingCopyGenerator> generator_;
};

} // namespace vclink::desktop
