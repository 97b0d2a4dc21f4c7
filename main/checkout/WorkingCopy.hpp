// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <unordered_map>

#include <git2/index.h>
#include <git2/object.h>
#include <git2/types.h>

#include "error/errorUtil/OwnedHandle.hpp"
#include "main/checkout/standing.hpp"
#include "util/repository/Head.hpp"

namespace vclink::git
{

/// What the rules of a checkout look at: the working tree, the index and HEAD's tree. Names are
/// relative to the root. Each operation throws LibGit2Exception if it cannot find out.
class WorkingCopy
{
  public:
    /// Reads the index and HEAD.
    /// @param repository outlives the object
    explicit WorkingCopy(git_repository *repository);

    /// HEAD's tree, null on an unborn branch.
    git_tree *head() const noexcept
    {
        return head_.get();
    }
    /// Whether HEAD is no longer what it was then.
    [[nodiscard]] bool hasHeadMoved() const;
    git_index *index() const noexcept
    {
        return index_.get();
    }

    /// Nothing, if something other than a folder is above.
    Standing at(const std::string &name);
    /// See vclink::git::holdsFiles.
    bool holdsFiles(const std::string &folder) const;

    /// Whether something beside the folder has a name that sorts between the folder's own and the
    /// folder's with a slash at its end, e.g. "lib-1" for "lib". The folder is there.
    bool hasSiblingBeforeFolder(const std::string &folder) const;

    /// What is above a name. `blocker` is empty where folders lead there, or where there is
    /// nothing; else it is the name of the first thing that keeps a file from being written there:
    /// something that is no folder, or a folder with files in the place of a file of HEAD.
    struct Way
    {
        Standing standing = Standing::Folder;
        std::string blocker;
    };
    /// Remembers the folders that it has seen.
    const Way &wayTo(const std::string &name);
    void forgetWays();

    /// The index's entry, null if there is none that is merged.
    const git_index_entry *entryOf(const std::string &name) const;
    bool isInHead(const std::string &name) const;
    /// Whether HEAD has a folder of this name.
    bool isFolderInHead(const std::string &name) const;
    /// The first thing in the folder, at any depth, that HEAD does not have: untracked, ignored or
    /// added to the index. Empty if there is none.
    std::string foreignBelow(const std::string &folder) const;
    /// The first name below the folder that the index has and HEAD does not. Empty if there is
    /// none.
    std::string stagedBelow(const std::string &folder) const;
    /// git_ignore_path_is_ignored.
    bool isIgnored(const std::string &name) const;
    /// Whether the file, link or folder differs from its entry in the index, by content. A missing
    /// file does not.
    bool isEdited(const git_index_entry &entry);

  private:
    git_object_t typeInHead(const std::string &name) const;
    Way wayInto(const std::string &folder, const Way &above) const;
    git_oid idOf(const std::string &name, Standing standing) const;

    git_repository *repository_;
    std::string root_;
    OwnedHandle<git_index> index_;
    Head headThen_;
    OwnedHandle<git_tree> head_;
    const Way wayToRoot_{};
    std::unordered_map<std::string, Way> ways_;
};

} // namespace vclink::git
