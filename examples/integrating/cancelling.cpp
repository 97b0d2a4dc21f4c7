// SPDX-License-Identifier: MIT
#include <atomic>
#include <memory>
#include <string>
#include <utility>

#include "hostTools.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink_host/cancellation.hpp"

/// A switch of branches with a Cancel button.
class CancellableSwitch
{
  public:
    /// @param show called on the worker's thread: hand its arguments over to the window's
    explicit CancellableSwitch(host_tools::ThrottledProgress::Show show)
        : interactor_(std::make_shared<host_tools::Interactor>(std::move(show)))
    {
    }

    /// On the worker's thread.
    /// @throws vclink::util::exception::CancelledOperationException
    void run(const upath &folder, const std::string &branch)
    {
        const auto adapter = vclink::git::GitAdapterFactory().createAdapterFor(folder, interactor_);
        // A request that comes before the adapter is there is lost.
        isListening_ = true;
        vclink::git::BranchManager::create(*adapter)->switchBranch(branch);
    }

    /// Whether Cancel is enabled. Any thread.
    bool canCancel() const noexcept
    {
        return isListening_ && !interactor_->isWriting();
    }
    /// On the window's thread.
    void cancel()
    {
        // A request that comes later would have no effect on this operation.
        if (canCancel())
            vclink_host::requestCancellation(interactor_->getTerminator());
    }

  private:
    std::shared_ptr<host_tools::Interactor> interactor_;
    std::atomic<bool> isListening_{false};
};
