// SPDX-License-Identifier: MIT
#include "vclink/git/GitWorkingCopyGenerator.hpp"

#include <string>
#include <utility>

#include <git2/clone.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/gitString.hpp"
#include "error/logging/ScopeTrace.hpp"
#include "error/logging/logger.hpp"
#include "fl/i18n/convert.hpp"
#include "main/checkout/CloneWatch.hpp"
#include "main/remote/SigpipeBlock.hpp"
#include "options/GitCallbacks.hpp"
#include "options/gitRecords.hpp"
#include "scl/core/memory/make_unique_incomplete.hpp"
#include "vclink/git/LibGit2Guard.hpp"

namespace vclink::git
{

struct GitWorkingCopyGenerator::Impl
{
    explicit Impl(std::unique_ptr<GitOptionsFactory> factory)
        : optionsFactory(std::move(factory)),
          callbacks(makeDefaultGitCallbacks(optionsFactory->getInteractor()))
    {
    }

    // Constructed first and destroyed last, so that libgit2 outlives everything that needs it.
    LibGit2Guard guard;
    std::unique_ptr<GitOptionsFactory> optionsFactory;
    std::unique_ptr<GitCallbacks> callbacks;
};

GitWorkingCopyGenerator::GitWorkingCopyGenerator(std::unique_ptr<GitOptionsFactory> factory)
    : impl_(scl::core::memory::make_unique_incomplete<Impl, Impl>(std::move(factory)))
{
}

GitWorkingCopyGenerator::GitWorkingCopyGenerator(std::shared_ptr<ApplicationInteractor> interactor)
    : GitWorkingCopyGenerator(GitOptionsFactory::makeDefault(std::move(interactor)))
{
}

GitWorkingCopyGenerator::~GitWorkingCopyGenerator() = default;

void GitWorkingCopyGenerator::generate(const ustring &repositorySpecifier, const upath &sandboxRoot)
{
    const ScopeTrace trace(
        logger(),
        "virtual void vclink::git::GitWorkingCopyGenerator::generate(const ustring&, const upath&)",
        "main/GitWorkingCopyGenerator", 45);
    writeRecord(
        SeverityParameter,
        " repositorySpecifier=", [&] { return fl::i18n::to_string(repositorySpecifier); },
        " sandboxRoot.string()=", [&] { return fl::i18n::to_string(sandboxRoot.string()); });
    const std::string url = toGitString(repositorySpecifier);
    const std::string path = toGitString(sandboxRoot.string());
    const CloneOptions options = impl_->optionsFactory->makeCloneOptions();
    git_clone_options record = toGitCloneOptions(options, *impl_->callbacks);
    const SigpipeBlock sigpipe;
    const CloneWatch watch(record);
    acquire<git_repository>(git_clone, url.c_str(), path.c_str(), &record).value();
}

} // namespace vclink::git
