// SPDX-License-Identifier: MIT
#include "util/repository/Head.hpp"

#include <utility>

#include <git2/errors.h>
#include <git2/refs.h>
#include <git2/repository.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/raiseGitError.hpp"
#include "util/repository/objectIds.hpp"

namespace vclink::git
{

const char *const Head::movedText =
    "another process has moved HEAD or its branch meanwhile; nothing has been changed, try again";

Head::Head(const git_reference *reference)
{
    if (reference != nullptr)
    {
        reference_ = git_reference_name(reference);
        id_ = *git_reference_target(reference);
    }
}

bool Head::hasMoved(git_repository *repository) const
{
    const OwnedHandle<git_reference> reference = lookupHead(repository);
    const Head now(reference.get());
    return now.reference_ != reference_ || !isSameId(now.id_, id_);
}

void Head::refuseMoved(git_repository *repository) const
{
    if (hasMoved(repository))
    {
        raiseGitError(GIT_EMODIFIED, GIT_ERROR_REFERENCE, movedText);
    }
}

OwnedHandle<git_reference> lookupHead(git_repository *repository)
{
    auto head = acquire<git_reference>(git_repository_head, repository);
    if (head.has_error() && head.error().getCode() == GIT_EUNBORNBRANCH)
    {
        return nullptr;
    }
    return std::move(head).value();
}

} // namespace vclink::git
