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

/// Clones repositories, and keeps nothing of a clone. Holds a LibGit2Guard. Use it on one thread at
/// a time.
class VCLINK_GIT_EXPORT GitWorkingCopyGenerator : public vclink::WorkingCopyGenerator
{
  public:
    /// Creates a generator with the options of a factory.
    /// @param factory not null, and created with an interactor
    explicit GitWorkingCopyGenerator(std::unique_ptr<GitOptionsFactory> factory);
    /// Creates a generator with GitOptionsFactory::makeDefault, as
    /// GitAdapterFactory::createWorkingCopyGenerator does.
    /// @param interactor not null; shared for the generator's life
    explicit GitWorkingCopyGenerator(std::shared_ptr<ApplicationInteractor> interactor);
    GitWorkingCopyGenerator(const GitWorkingCopyGenerator &) = delete;
    GitWorkingCopyGenerator &operator=(const GitWorkingCopyGenerator &) = delete;
    ~GitWorkingCopyGenerator() override;

    /// Clones a repository and checks out its files. Names the remote "origin". Reports the
    /// progress of the checkout. Access, certificates and time limits are those of GitRemote. Runs
    /// to its end on the calling thread, with SIGPIPE blocked.
    ///
    /// After a failure or a cancellation libgit2 removes what it created: the folder, or its
    /// content if the folder existed. The object can be used again, with one restriction: transfer
    /// and checkout each remember a cancellation request. A request that ended the transfer also
    /// stops the next checkout of this object at its first file, and a request that ended a
    /// checkout also stops the next transfer. git_clone.
    /// @param repositorySpecifier a URL, `user@host:path`, or a path on this machine, which can be
    /// relative to the process's working folder; used unchanged
    /// @param sandboxRoot the folder of the working copy, which must be missing or empty; used
    /// unchanged
    /// @throws LibGit2Exception, with GIT_EINVALIDSPEC and nothing created for an argument with a
    /// NUL character
    /// @throws vclink::util::exception::CancelledOperationException if the application requests it,
    /// during the transfer or at the next file of the checkout
    void generate(const ustring &repositorySpecifier, const upath &sandboxRoot) override;

  private:
    struct Impl;
    std::unique_ptr<Impl, std::function<void(Impl *)>> impl_;
};

} // namespace vclink::git
