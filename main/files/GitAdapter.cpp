// SPDX-License-Identifier: MIT
#include "main/files/GitAdapter.hpp"

#include <utility>

#include "util/repository/repository.hpp"

namespace vclink::git
{

GitAdapter::GitAdapter(const upath &root, std::shared_ptr<ApplicationInteractor> interactor)
    : GitAdapter(root, std::shared_ptr<GitOptionsFactory>(
                           GitOptionsFactory::makeDefault(std::move(interactor))))
{
}

GitAdapter::GitAdapter(const upath &root, std::shared_ptr<GitOptionsFactory> factory)
    : root_(root), optionsFactory_(std::move(factory)),
      callbacks_(makeDefaultGitCallbacks(optionsFactory_->getInteractor())),
      interactor_(optionsFactory_->getInteractor())
{
}

GitAdapter::~GitAdapter() = default;

const upath &GitAdapter::getRootFolder()
{
    return root_;
}

OwnedHandle<git_repository> GitAdapter::getRepository() const
{
    return openRepository(root_);
}

std::shared_ptr<GitOptionsFactory> GitAdapter::getOptionsFactory() const
{
    return optionsFactory_;
}

GitCallbacks &GitAdapter::getCallbacks() const
{
    return *callbacks_;
}

std::shared_ptr<ApplicationInteractor> GitAdapter::getInteractor() const
{
    return interactor_;
}

} // namespace vclink::git
