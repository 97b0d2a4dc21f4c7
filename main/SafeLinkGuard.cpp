// SPDX-License-Identifier: MIT
#include "main/SafeLinkGuard.hpp"

#include <git2/diff.h>
#include <git2/object.h>
#include <git2/oid.h>
#include <sys/stat.h>

#include "error/errorUtil/setGitError.hpp"
#include "util/repository.hpp"

namespace vclink::git
{
namespace
{

bool isFolder(const GitResult<OwnedHandle<git_object>> &object)
{
    return object.has_value() && git_object_type(object.value().get()) == GIT_OBJECT_TREE;
}

/// An ignored link where a new file belongs is overwritten, which means what it leads to.
bool isWrittenThrough(git_checkout_notify_t why, const git_diff_file *baseline,
                      const git_diff_file *target)
{
    return why == GIT_CHECKOUT_NOTIFY_UPDATED && baseline == nullptr && target != nullptr &&
           S_ISREG(target->mode);
}

int refuse(const std::string &name)
{
    const std::string text = "the symbolic link '" + name + "' is in the way of the checkout";
    git_error_set_str(GIT_ERROR_CHECKOUT, text.c_str());
    return GIT_ECONFLICT;
}

} // namespace

SafeLinkGuard::SafeLinkGuard(git_repository *repository, const git_object *target,
                             git_checkout_options &record)
    : LinkGuard(record), repository_(repository), target_(git_oid_tostr_s(git_object_id(target)))
{
}

int SafeLinkGuard::notify(git_checkout_notify_t why, const char * /*path*/,
                          const git_diff_file *baseline, const git_diff_file *target,
                          const git_diff_file *workdir)
{
    if (workdir == nullptr || !S_ISLNK(workdir->mode))
    {
        return 0;
    }
    // The link's own name: the path may be that of a file below it.
    const std::string name = workdir->path;
    const bool isInTheWay = isWrittenThrough(why, baseline, target) || isChangedFolder(name);
    return isInTheWay ? refuse(name) : 0;
}

/// Whether there is a folder of this name that the checkout makes, changes or takes away.
bool SafeLinkGuard::isChangedFolder(const std::string &name) const
{
    const auto before = revparseObject(repository_, "HEAD:" + name);
    const auto after = revparseObject(repository_, target_ + ':' + name);
    if (!isFolder(before) || !isFolder(after))
    {
        return isFolder(before) || isFolder(after);
    }
    const git_oid *const id = git_object_id(before.value().get());
    return git_oid_equal(id, git_object_id(after.value().get())) == 0;
}

} // namespace vclink::git
