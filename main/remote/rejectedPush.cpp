// SPDX-License-Identifier: MIT
#include "main/remote/rejectedPush.hpp"

#include <algorithm>
#include <array>
#include <cerrno>
#include <iterator>
#include <optional>
#include <string>
#include <utility>

#include <git2/config.h>
#include <git2/errors.h>
#include <git2/object.h>
#include <git2/remote.h>
#include <git2/repository.h>
#include <strings.h>
#include <unistd.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/raiseGitError.hpp"
#include "main/remote/lookAhead.hpp"
#include "main/remote/remotePath.hpp"
#include "util/repository/objectIds.hpp"
#include "util/repository/repository.hpp"
#include "util/repository/settings.hpp"
#include "util/repository/workingTrees.hpp"

namespace vclink::git
{
namespace
{

[[noreturn]] void raiseRejected(const std::string &text)
{
    raiseGitError(GIT_ERROR, GIT_ERROR_REFERENCE, text);
}

OwnedHandle<git_repository> openAt(const std::string &path)
{
    return acquire<git_repository>(git_repository_open_ext, path.c_str(),
                                   unsigned{GIT_REPOSITORY_OPEN_NO_SEARCH}, nullptr)
        .value();
}

/// Returns true if a setting such as receive.denyCurrentBranch permits what git denies by default.
bool permits(git_config *config, const char *setting)
{
    // An empty text can also be a setting without a value, which means yes.
    static constexpr std::array<const char *, 6> permissions{"ignore", "warn", "false",
                                                             "no",     "off",  "0"};
    const char *value = nullptr;
    const GitResult<void> found = call(git_config_get_string, &value, config, setting);
    if (found.has_error() && found.error().getCode() == GIT_ENOTFOUND)
    {
        return false;
    }
    check(found);
    return std::any_of(permissions.begin(), permissions.end(),
                       [value](const char *permission)
                       { return ::strcasecmp(value, permission) == 0; });
}

/// Returns false only if the path certainly does not exist.
bool mayExist(const std::string &path)
{
    return ::access(path.c_str(), F_OK) == 0 || (errno != ENOENT && errno != ENOTDIR);
}

bool mayHaveWorkingTrees(const std::string &path)
{
    return mayExist(path + "/worktrees") || mayExist(path + "/.git");
}

/// The repository of a remote on this machine.
class Receiver
{
  public:
    explicit Receiver(const std::string &path)
        : repository_(openAt(path)),
          trees_(findLinkedWorkingTrees(git_repository_commondir(repository_.get()))),
          config_(acquire<git_config>(git_repository_config_snapshot, repository_.get()).value())
    {
    }

    std::optional<git_oid> findBranch(const std::string &name) const
    {
        return findId(repository_.get(), name);
    }

    void refuseCheckedOut(const std::string &branch) const
    {
        if (isUsed(branch) && !permits(config_.get(), "receive.denyCurrentBranch"))
        {
            raiseRejected(
                "'" + branch +
                "' is checked out in a linked working tree of the remote: push to another "
                "branch");
        }
    }

    void refuseDeletion(const std::string &branch) const
    {
        if (isSet(config_.get(), "receive.denyDeletes"))
        {
            raiseRejected("'" + branch +
                          "' cannot be deleted at the remote, because receive.denyDeletes is set "
                          "there");
        }
        const WorkingTree own(git_repository_path(repository_.get()));
        const bool isCurrent = isUsed(branch) || own.isOn(branch);
        if (isCurrent && !permits(config_.get(), "receive.denyDeleteCurrent"))
        {
            raiseRejected("'" + branch +
                          "' cannot be deleted at the remote, because it is the current branch "
                          "there");
        }
    }

    bool keepsCommits() const
    {
        return isSet(config_.get(), "receive.denyNonFastForwards");
    }

  private:
    bool isUsed(const std::string &branch) const
    {
        return std::any_of(trees_.begin(), trees_.end(),
                           [&branch](const WorkingTree &tree)
                           { return tree.isOn(branch) || tree.returnsTo(branch); });
    }

    OwnedHandle<git_repository> repository_;
    std::vector<WorkingTree> trees_;
    OwnedHandle<git_config> config_;
};

void refuseRejected(const Receiver &receiver, git_repository *repository, const Refspec &refspec)
{
    const auto there = receiver.findBranch(refspec.target);
    if (!there)
    {
        return;
    }
    if (refspec.source.empty())
    {
        receiver.refuseCheckedOut(refspec.target);
        receiver.refuseDeletion(refspec.target);
        return;
    }
    const git_oid here = *revparseId(refspec.source, repository);
    if (isSameId(here, *there))
    {
        return;
    }
    receiver.refuseCheckedOut(refspec.target);
    // Without a '+' libgit2 compares them itself.
    if (refspec.isForced && receiver.keepsCommits() && !descendsFrom(repository, here, *there))
    {
        raiseRejected("'" + refspec.target +
                      "' cannot lose commits at the remote, because receive.denyNonFastForwards is "
                      "set there: fetch and merge them");
    }
}

/// Returns true for a tree, and for a tag that leads to one, also through other tags.
bool isTree(git_repository *repository, const std::string &source)
{
    auto found = revparseObject(repository, source);
    const int code = found.has_error() ? found.error().getCode() : 0;
    if (code == GIT_ENOTFOUND || code == GIT_EINVALIDSPEC)
    {
        // The push reports it.
        return false;
    }
    OwnedHandle<git_object> object = std::move(found).value();
    if (git_object_type(object.get()) == GIT_OBJECT_TAG)
    {
        object = acquire<git_object>(git_object_peel, object.get(), GIT_OBJECT_ANY).value();
    }
    return git_object_type(object.get()) == GIT_OBJECT_TREE;
}

/// libgit2 would write the tree without what is in it. A server refuses that.
void refuseTrees(git_repository *repository, const std::string &path,
                 const std::vector<Refspec> &refspecs)
{
    for (const auto &[source, target, isForced] : refspecs)
    {
        // A branch is always at a commit.
        if (source.empty() || isIn(branchesFolder, source) || !isTree(repository, source))
        {
            continue;
        }
        const auto there = findId(openAt(path).get(), target);
        if (!there || !isSameId(*there, *revparseId(source, repository)))
        {
            raiseRejected("the content of the tree '" + source +
                          "' would be missing in the remote: use 'git push'");
        }
    }
}

} // namespace

void refuseRejectedPush(git_repository *repository, const git_remote *remote,
                        const std::vector<Refspec> &refspecs)
{
    const char *const address = git_remote_url(remote);
    const auto path = address != nullptr ? findRemotePath(address) : std::nullopt;
    if (!path)
    {
        return;
    }
    refuseTrees(repository, *path, refspecs);
    const bool hasTrees = mayHaveWorkingTrees(*path);
    std::vector<Refspec> suspects;
    std::copy_if(refspecs.begin(), refspecs.end(), std::back_inserter(suspects),
                 [hasTrees](const Refspec &refspec)
                 {
                     return isIn(branchesFolder, refspec.target) &&
                            (hasTrees || refspec.isForced || refspec.source.empty());
                 });
    if (suspects.empty())
    {
        return;
    }
    const Receiver receiver(*path);
    for (const Refspec &refspec : suspects)
    {
        refuseRejected(receiver, repository, refspec);
    }
}

} // namespace vclink::git
