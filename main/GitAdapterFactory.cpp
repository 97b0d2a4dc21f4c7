// SPDX-License-Identifier: MIT
#include "vclink/git/GitAdapterFactory.hpp"

#include <utility>

#include "main/files/GitAdapter.hpp"
#include "util/repository/repository.hpp"
#include "vclink/git/GitWorkingCopyGenerator.hpp"
#include "vclink/git/LibGit2Guard.hpp"

namespace vclink::git
{

GitAdapterFactory::GitAdapterFactory() = default;

GitAdapterFactory::~GitAdapterFactory() = default;

std::unique_ptr<CMAdapter>
GitAdapterFactory::createAdapterFor(const upath &root,
                                    std::shared_ptr<ApplicationInteractor> interactor) const
{
    return std::make_unique<GitAdapter>(root, std::move(interactor));
}

std::unique_ptr<WorkingCopyGenerator> GitAdapterFactory::createWorkingCopyGenerator(
    std::shared_ptr<ApplicationInteractor> interactor) const
{
    return std::make_unique<GitWorkingCopyGenerator>(std::move(interactor));
}

bool GitAdapterFactory::isAdapterFor(const upath &path) const
{
    const LibGit2Guard guard;
    return isRepository(path);
}

ustring GitAdapterFactory::getName() const
{
    return u"git";
}

} // namespace vclink::git
