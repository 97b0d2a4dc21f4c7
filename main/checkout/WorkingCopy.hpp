// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <unordered_map>

#include <git2/index.h>
#include <git2/object.h>
#include <git2/types.h>
#include <sys/stat.h>

#include "error/errorUtil/OwnedHandle.hpp"
#include "main/checkout/standing.hpp"
#include "main/checkout/treeChanges.hpp"
#include "util/repository/Head.hpp"

namespace vclink::git
{

/// Returns true if Git hides changes of the entry's file.
bool isHidden(const git_index_entry &entry) noexcept;

/// The working tree, the index and HEAD's tree, for the rules of a checkout. Names are relative to
/// the root. Each operation throws LibGit2Exception if it cannot find out.
class WorkingCopy
{
  public:
    /// Reads the index and HEAD.
    /// @param repository outlives the object
    explicit WorkingCopy(git_repository *repository);

    /// Returns HEAD's tree, null on an unborn branch.
    git_tree *head() const noexcept
    {
        return head_.get();
    }
    /// Returns true if HEAD has moved since construction.
    [[nodiscard]] bool hasHeadMoved() const;
    git_index *index() const noexcept
    {
        return index_.get();
    }
    /// Returns false if there is no index file: no file was checked out yet.
    bool hasIndex() const noexcept
    {
        return hasIndex_;
    }

    /// Returns what is at a name: nothing if something above it is not a folder.
    Standing at(const std::string &name);
    /// Returns what lstat says of the name; zeros for nothing. Remembers what at() has seen last.
    const struct stat &statusOf(const std::string &name);
    /// Returns false if the process may not read the file.
    [[nodiscard]] bool isReadable(const std::string &name);
    /// See vclink::git::holdsFiles.
    bool holdsFiles(const std::string &folder) const;

    /// Returns true if a name in the same folder sorts between the folder's name and that name with
    /// a slash appended, e.g. "lib-1" for "lib". The folder must exist.
    bool hasSiblingBeforeFolder(const std::string &folder) const;

    /// What is above a name. `blocker` is empty if folders lead there, or if there is nothing.
    /// Otherwise it is the name of the first thing that prevents a file there: something that is
    /// not a folder, or a folder with files in the place of a file of HEAD.
    struct Way
    {
        Standing standing = Standing::Folder;
        std::string blocker;
    };
    /// Returns what is above a name. Remembers the folders that it has seen.
    /// @param isInHead true if HEAD is known to have the name: its folders are not looked up then
    const Way &wayTo(const std::string &name, bool isInHead = false);

    /// Returns the index's entry, null if there is none without a conflict. Remembers the last one,
    /// since several rules ask for it.
    const git_index_entry *entryOf(const std::string &name);

    /// Returns true if isHidden holds for an entry of the index. Remembers it for good: nothing
    /// that this library does hides a file.
    [[nodiscard]] bool hasHidden();

    /// Returns true if the index has anything below a folder of this name.
    [[nodiscard]] bool hasEntryBelow(const std::string &folder) const;

    /// Forgets folders and entry. To be called when files or the index may have changed.
    void forget();

    /// Returns the nearest folder above a name, with a slash at its end, if the process may not
    /// create and remove files in it. "./" for the root; empty if it may. Remembers the last one.
    const std::string &unwritableFolderOf(const std::string &name);
    /// Reads `.gitmodules` if the checkout creates or moves a submodule: libgit2 does so in the
    /// middle of its writing. git_submodule_lookup.
    /// @throws LibGit2Exception if it cannot be read
    void readModulesFor(const TreeChange &change) const;

    /// Returns true if this is a file that a checkout cannot simply write to; see
    /// vclink::git::mustBeRemade.
    bool mustBeRemade(const std::string &name);

    bool isInHead(const std::string &name) const;
    /// Returns true if HEAD has a folder of this name.
    bool isFolderInHead(const std::string &name) const;
    /// Returns the first thing in the folder, at any depth, that HEAD does not have: untracked,
    /// ignored or added to the index. Empty if there is none.
    std::string foreignBelow(const std::string &folder) const;
    /// Returns the first name below the folder that the index has and HEAD does not. Empty if there
    /// is none.
    std::string stagedBelow(const std::string &folder) const;
    /// Returns true if Git ignores the name, and no pattern may exempt it. See mayBeNegated.
    bool isIgnored(const std::string &name) const;
    /// Returns true if libgit2 ignores the name. git_ignore_path_is_ignored.
    [[nodiscard]] bool isIgnoredByLibGit2(const std::string &name) const;
    /// Returns true if libgit2 ignores the name, and Git may not.
    bool isFalselyIgnored(const std::string &name) const;
    /// Returns true if only git can tell what it would store: a filter with a command is configured
    /// for the file, or it has another encoding than UTF-8 in the working tree. See isEdited.
    /// git_repository_config_snapshot, git_config_get_string.
    [[nodiscard]] bool isConvertedByGit(const std::string &name);
    /// Returns true if the content of the file, link or folder differs from its entry in the index.
    /// A missing file does not differ.
    bool isEdited(const git_index_entry &entry);
    /// Returns true if the file or link has neither the content of HEAD nor of the target.
    [[nodiscard]] bool isOfNeither(const TreeChange &change);
    /// Returns true if libgit2 cannot tell an edited file from its entry in the index or from what
    /// a checkout writes, because it compares them after the conversion of line ends or of `$Id$`.
    /// @param entry has another size than the file, which exists
    /// @param after may be null
    [[nodiscard]] bool isEditHiddenByConversion(const git_index_entry &entry,
                                                const git_tree_entry *after) const;

  private:
    /// In a buffer that the next call uses again: this runs for each file of a checkout.
    const std::string &pathOf(const std::string &name);
    const git_index_entry *findEntry(const char *name);
    git_object_t typeInHead(const std::string &name) const;
    const Way &findWay(const std::string &name, bool isInHead);
    Way wayInto(const std::string &folder, const Way &above, bool isInHead) const;
    bool runsFilter(const std::string &filter);
    git_oid idOf(const std::string &name, Standing standing) const;
    git_oid idOfFile(const std::string &name, const std::string &nameForFilters) const;

    git_repository *repository_;
    std::string root_;
    OwnedHandle<git_index> index_;
    bool hasIndex_;
    Head headThen_;
    OwnedHandle<git_tree> head_;
    const Way wayToRoot_{};
    std::unordered_map<std::string, Way> ways_;
    /// The filters that were asked for, and whether each has a command.
    std::unordered_map<std::string, bool> filters_;
    /// The folder that was looked at last, and the way to it; null for none.
    std::string folder_;
    const Way *wayToFolder_ = nullptr;
    /// The entry that was asked for last, null for none, and the last name without one.
    const git_index_entry *entry_ = nullptr;
    std::string missing_;
    /// Where the last search in the index ended.
    std::size_t place_ = 0;
    std::optional<bool> hasHidden_;
    /// The root, and a name.
    std::string path_;
    /// Of that path, if isKnown_.
    struct stat status_ = {};
    bool isKnown_ = false;
    /// The folder that was examined last, and what came out.
    std::optional<std::string> examined_;
    std::string unwritable_;
};

} // namespace vclink::git
