// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/CMAdapterFactory.hpp"
#include "vclink/WorkingCopyGenerator.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// @page adapter_operations The operations of an adapter
///
/// Describes the operations of vclink::CMAdapter in the adapter that
/// GitAdapterFactory::createAdapterFor returns.
///
/// @section adapter_common All operations
/// Each operation opens the repository, sees its current state, runs to its end on the calling
/// thread and keeps nothing. It throws LibGit2Exception with libgit2's text if the repository
/// cannot be opened or a call to libgit2 fails.
///
/// Lists of files: a file outside the working copy, or one that Git does not know, matches nothing.
/// In a name the characters '*', '?' and '[' act as patterns, so other files can match too, and a
/// backslash acts as a slash. A symbolic link means its target, or itself if the target does not
/// exist. A folder means everything below it, except the root, which matches nothing: list its
/// content, or use getFolderStates for states. An operation throws
/// boost::filesystem::filesystem_error if a path cannot be resolved, and LibGit2Exception with
/// GIT_EINVALIDSPEC, before anything is opened, if a path or the root has a NUL character.
///
/// The index on disk, Git's list of files for the next commit, is written completely or not at all.
/// Operations that change it hold git's lock, `index.lock`, from before they read it. If something
/// else holds the lock, including another operation of this process, they throw LibGit2Exception
/// with the code GIT_ELOCKED and the lock's name, and change nothing. The library never removes a
/// lock of others.
///
/// Operations on files refuse a `.gitignore` or `.git/info/exclude` with a line at which libgit2
/// would end the process or never end. Additions, commits and reverts also refuse values of
/// core.autocrlf, core.safecrlf, core.eol and core.logAllRefUpdates that libgit2 cannot read. The
/// text names the line or the setting.
///
/// @section adapter_getFileStates getFileStates
/// Returns the states of the listed files, with one walk for the whole list. Files that Git
/// ignores, and files that neither exist nor are known to Git, are not in the result. An empty list
/// returns an empty map and opens nothing.
///
/// If libgit2 cannot read the working copy, the result is empty and nothing is thrown, as for a
/// bare repository. A result is incomplete only if memory runs out, because libgit2 reads
/// everything before it reports the first state. git_status_foreach_ext.
///
/// @section adapter_getFolderStates getFolderStates
/// Returns the states of all files below a folder, without ignored ones. A working copy that
/// cannot be read gives an empty result, as in getFileStates. git_status_foreach_ext.
///
/// @section adapter_addFiles addFiles
/// Starts tracking unversioned files. If Git already knows some of the files, in any state, adds
/// nothing and throws the exception of shared_vclink::git::AlreadyAdded, which lists them.
/// git_index_add_all.
///
/// @section adapter_removeFiles removeFiles
/// Stops tracking files; they stay on disk. Throws the exception of
/// shared_vclink::git::NoFilesToRemove if no file is left to remove. git_index_remove_all.
///
/// @section adapter_markResolved markResolved
/// Marks a conflict in a file as resolved: stages the current file, whatever the index has for it.
/// If the file does not exist, or is a link without a target, stages its deletion.
/// git_index_add_all, git_index_remove_all.
///
/// @section adapter_commit commit
/// Commits all tracked files as they are on disk, staged or not, on the current branch, and ends a
/// merge or any other operation under way. Files in conflict are committed as they are, including
/// markers. Makes a commit even if nothing has changed. The first argument is ignored. The message
/// is used unchanged, up to the first NUL. The author is that of `user.name` and `user.email`,
/// otherwise "USER" or "LOGNAME" at the machine's name. Throws the exception of
/// shared_vclink::git::NoUserName if there is neither, and boost::system::system_error if the
/// machine's name cannot be found out.
///
/// Between two steps of a series of cherry-picks or reverts, keeps the rest of the series.
///
/// A file that a sparse checkout leaves out stays as in the index; a file that cannot be read makes
/// the commit fail. If another process has locked the branch, the commit tries again for
/// `core.filesRefLockTimeout` milliseconds, 100 by default.
///
/// A commit refuses in these cases; nothing has changed then, and the text describes what to do:
/// - It would conclude a merge whose process was killed, or whose MERGE_HEAD is damaged. The class
///   is GIT_ERROR_MERGE.
/// - It would end a merge, squash or rebase for which git has put changes aside (`--autostash`).
/// - `git am` has more patches to apply.
/// - `git rebase` has stopped at a merge.
/// - `core.ignorecase` is set, and the index has another name that differs from that of a changed
///   file only in case.
///
/// After a failure HEAD and the state of a merge are as before, and the changes may be staged. In
/// two cases the commit exists although an exception is thrown: if the state of the merge cannot be
/// removed, or if the new commit cannot be read again. git_index_update_all, git_commit_create,
/// git_repository_state_cleanup.
///
/// @section adapter_revertFiles revertFiles
/// Discards all changes to the files, staged or not, and restores missing files. As in git, deletes
/// what is in the place of a listed file: a folder with all its content, a symbolic link, a FIFO, a
/// socket or a device. A file that HEAD, the last commit, does not have is removed from the index
/// and stays on disk. If some files are in conflict, changes nothing and throws the exception of
/// shared_vclink::git::Conflicted, which lists them. If something is in the way that
/// it cannot clear, throws LibGit2Exception with code GIT_ECONFLICT before it writes a file;
/// docs/limitations.md lists these cases.
///
/// Reports progress. Throws vclink::util::exception::CancelledOperationException if the application
/// requests it before the first file is written; then the index entries of the files are those of
/// HEAD, and the files are untouched, except that a socket or device in their place is gone. After
/// any other failure of the checkout some files may be restored. git_reset_default,
/// git_checkout_index.
///
/// @section adapter_getRootFolder getRootFolder
/// Returns the root as the host specified it. Opens nothing.

/// Creates adapters for Git. Holds no data: one object can serve the whole process, on every
/// thread.
class VCLINK_GIT_EXPORT GitAdapterFactory : public vclink::CMAdapterFactory
{
  public:
    GitAdapterFactory();
    ~GitAdapterFactory() override;

    /// Creates an adapter for the working copy whose root is `root`. The host owns it. Opens
    /// nothing: if the folder is not a repository, the first operation fails. Every path that the
    /// adapter returns begins with `root`, unchanged.
    ///
    /// An adapter holds a LibGit2Guard. It belongs to one thread at a time, and runs every
    /// operation to its end on the calling thread. It caches nothing: each operation opens the
    /// repository and sees its current state.
    ///
    /// @ref adapter_operations describes each operation.
    ///
    /// @param root the root of the working tree
    /// @param interactor not null; shared for the adapter's life
    /// @throws std::bad_alloc
    [[nodiscard]] std::unique_ptr<CMAdapter>
    createAdapterFor(const upath &root,
                     std::shared_ptr<ApplicationInteractor> interactor) const override;

    /// Creates a GitWorkingCopyGenerator. The host owns it. Opens nothing.
    /// @param interactor not null; shared for the generator's life
    /// @throws std::bad_alloc
    [[nodiscard]] std::unique_ptr<WorkingCopyGenerator>
    createWorkingCopyGenerator(std::shared_ptr<ApplicationInteractor> interactor) const override;

    /// Returns true if the folder itself is a Git repository, with or without a working tree. A
    /// folder inside a working copy is not. Checks only the folder's layout: if the repository
    /// cannot be opened, or belongs to another user, the adapter's first operation fails. Holds a
    /// LibGit2Guard during the call. git_repository_open_ext.
    /// @throws LibGit2Exception if this cannot be found out, e.g. without permission to enter a
    /// folder above it; with GIT_EINVALIDSPEC for a path with a NUL character
    bool isAdapterFor(const upath &path) const override;

    /// Returns "git".
    ustring getName() const override;
};

} // namespace vclink::git
