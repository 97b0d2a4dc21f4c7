// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <memory>

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/WorkingCopyGenerator.hpp"
#include "vclink/git/GitOptionsFactory.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// Clones repositories, as often as it is asked, and keeps nothing of a clone. Holds a
/// LibGit2Guard. For one thread at a time.
class VCLINK_GIT_EXPORT GitWorkingCopyGenerator : public vclink::WorkingCopyGenerator
{
  public:
    /// @param factory not null, and made with an interactor
    explicit GitWorkingCopyGenerator(std::unique_ptr<GitOptionsFactory> factory);
    /// With GitOptionsFactory::makeDefault. See GitAdapterFactory::createWorkingCopyGenerator.
    /// @param interactor not null; shared for the generator's life
    explicit GitWorkingCopyGenerator(std::shared_ptr<ApplicationInteractor> interactor);
    GitWorkingCopyGenerator(const GitWorkingCopyGenerator &) = delete;
    GitWorkingCopyGenerator &operator=(const GitWorkingCopyGenerator &) = delete;
    ~GitWorkingCopyGenerator() override;

    /// Clones a repository, with its files checked out. The remote is named "origin". Reports the
    /// progress of the checkout; access to the repository, certificates and time are as GitRemote
    /// tells. Runs to its end on the calling thread, which has SIGPIPE blocked meanwhile.
    ///
    /// After a failure or a cancellation libgit2 removes what it made: the folder, or what it put
    /// into one that was there. The object is as good as new, save for one thing: transfer and
    /// checkout each remember a request for cancellation, so that one that ended the transfer still
    /// stops the next checkout of this object at its first file, and one that ended a checkout the
    /// next transfer. git_clone.
    /// @param repositorySpecifier a URL, `user@host:path`, or a path on this machine, which may be
    /// relative to the process's working folder; taken as it stands
    /// @param sandboxRoot the folder of the working copy: missing, or empty; taken as it stands
    /// @throws LibGit2Exception; with GIT_EINVALIDSPEC, and nothing made, for an argument with a
    /// NUL character
    /// @throws vclink::util::exception::CancelledOperationException when the application asks for
    /// it, during the transfer or at the next file of the checkout
    void generate(const ustring &repositorySpecifier, const upath &sandboxRoot) override;

  private:
    struct Impl;
    std::unique_ptr<Impl, std::function<void(Impl *)>> impl_;
};

} // namespace vclink::git
