// SPDX-License-Identifier: MIT
#include "Work.hpp"

#include <mutex>
#include <utility>

#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/LibGit2Guard.hpp"

namespace vclink::desktop
{

Work::Work(std::shared_mutex &guards, upath root, std::shared_ptr<ApplicationInteractor> interactor,
           std::function<void()> attached)
    : guards_(guards), root_(std::move(root)), interactor_(std::move(interactor)),
      attached_(std::move(attached))
{
}

Work::~Work()
{
    const std::shared_lock lock(guards_);
    adapter_.reset();
    generator_.reset();
}

CMAdapter &Work::adapter()
{
    if (adapter_ == nullptr)
    {
        {
            const std::shared_lock lock(guards_);
            adapter_ = git::GitAdapterFactory().createAdapterFor(root_, interactor_);
        }
        // A request that comes before the adapter listens is lost.
        attached_();
    }
    return *adapter_;
}

std::unique_ptr<git::BranchManager> Work::branches()
{
    return git::BranchManager::create(adapter());
}

void Work::merge(const std::string &name)
{
    const auto manager = branches();
    const std::unique_lock lock(guards_);
    const git::LibGit2Guard guard;
    manager->merge(name);
}

void Work::clone(const ustring &repository, const upath &folder)
{
    {
        const std::shared_lock lock(guards_);
        generator_ = git::GitAdapterFactory().createWorkingCopyGenerator(interactor_);
    }
    attached_();
    generator_->generate(repository, folder);
}

bool Work::serves(const upath &folder) const
{
    const std::shared_lock lock(guards_);
    return git::GitAdapterFactory().isAdapterFor(folder);
}

} // namespace vclink::desktop
