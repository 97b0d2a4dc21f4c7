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
/// What vclink::CMAdapter's operations do in the adapter that GitAdapterFactory::createAdapterFor
/// makes.
///
/// @section adapter_common All operations
/// Each operation opens the repository, sees it as it then is, runs to its end on the calling
/// thread and keeps nothing. It throws LibGit2Exception with libgit2's text if the repository
/// cannot be opened or a call to libgit2 fails.
///
/// Lists of files: a file outside the working copy, or one that Git does not know, matches nothing.
/// The characters '*', '?' and '[' in a name act as patterns. A symbolic link means its target, or
/// itself if it leads nowhere. A folder means all below it, except the root, which matches nothing:
/// name what is in it, or use getFolderStates for states. Throws
/// boost::filesystem::filesystem_error if a path cannot be resolved. A path with a NUL character,
/// also in the root, is refused with GIT_EINVALIDSPEC before anything is opened.
///
/// The index on disk is written whole or not at all. Operations that change it hold git's lock,
/// `index.lock`, from before they read it. While something else holds the lock, another operation
/// of this process included, they throw LibGit2Exception with the code GIT_ELOCKED and the lock's
/// name, and change nothing. The library removes no lock that it has not made.
///
/// @section adapter_getFileStates getFileStates
/// Returns the states of the files named, in one walk for the whole list. A file that Git ignores,
/// or that neither the disk nor Git has, is not in the result. An empty list gives an empty
/// map and opens nothing. If libgit2 cannot read the working copy, the result is empty, as it is
/// for a bare repository; nothing is thrown. libgit2 reads all of it before it reports the first
/// state, so that states are missing from a result only if memory runs out. git_status_foreach_ext.
///
/// @section adapter_getFolderStates getFolderStates
/// Returns the states of all files below a folder, without ignored ones. A working copy that
/// cannot be read gives an empty result, as in getFileStates. git_status_foreach_ext.
///
/// @section adapter_addFiles addFiles
/// Begins to track unversioned files. Throws the exception of shared_vclink::git::AlreadyAdded,
/// which names them, if Git knows some of the files in whatever state; nothing is added then.
/// git_index_add_all.
///
/// @section adapter_removeFiles removeFiles
/// Stops tracking files; they stay on the disk. Throws the exception of
/// shared_vclink::git::NoFilesToRemove if there is none that is not removed already.
/// git_index_remove_all.
///
/// @section adapter_markResolved markResolved
/// Replaces what the index has for a file, a conflict included, by the file as it now is, or by its
/// absence. A link that leads nowhere counts as absent. git_index_add_all, git_index_remove_all.
///
/// @section adapter_commit commit
/// Commits every tracked file as it is on the disk, staged or not, on HEAD, also if nothing has
/// changed, and concludes a merge or whatever else is under way. The first argument is not read.
/// The message is used unchanged, up to a first NUL. The author is who `user.name` and `user.email`
/// name, otherwise "USER" or "LOGNAME" at the host's name. Throws the exception of
/// shared_vclink::git::NoUserName if there is neither, and boost::system::system_error if the
/// host's name cannot be found out.
///
/// Files in conflict are committed as they are, markers included. A file that a sparse checkout
/// leaves out stays as the index has it; one that cannot be read makes the commit fail. If the
/// branch is locked, the commit tries again for `core.filesRefLockTimeout` milliseconds, 100 by
/// default. It refuses to conclude a merge whose process was killed, with the class
/// GIT_ERROR_MERGE and a text that names the way out; nothing has changed then.
///
/// After a failure HEAD and the state of a merge are as before, and the index may hold the changes
/// already. The commit exists only if the state cannot be cleaned up, or the new commit cannot be
/// read. git_index_update_all, git_commit_create, git_repository_state_cleanup.
///
/// @section adapter_revertFiles revertFiles
/// Discards all changes to the files, staged or not, and restores missing ones. A file that HEAD
/// does not have leaves the index and stays on the disk. As in git, what is in the place of a
/// listed file is deleted, including a folder with all its content; symbolic links, FIFOs, sockets
/// and devices are replaced. Throws the exception of shared_vclink::git::Conflicted, which names
/// them, if some files are in conflict; nothing is changed then.
///
/// Reports progress. Ends with vclink::util::exception::CancelledOperationException if the
/// application asks for it before the first file is written; the index is back at HEAD then, and
/// the files are untouched. After any other failure of the checkout the files may be restored in
/// part. git_reset_default, git_checkout_index.
///
/// @section adapter_getRootFolder getRootFolder
/// Returns the root as the host has given it. Opens nothing.

/// The host's entry to the Git back end. Holds no data: one object may serve the whole process, on
/// every thread.
class VCLINK_GIT_EXPORT GitAdapterFactory : public vclink::CMAdapterFactory
{
  public:
    GitAdapterFactory();
    ~GitAdapterFactory() override;

    /// An adapter for the working copy whose root is `root`, which the host owns. The text of
    /// `root` is kept as given, and stands at the beginning of every path that the adapter gives
    /// out. Nothing is opened: a folder that is no repository shows at the first operation.
    ///
    /// An adapter keeps libgit2 alive (LibGit2Guard). It belongs to one thread at a time, and runs
    /// every operation to its end on the calling thread. It caches nothing: each operation opens
    /// the repository and sees it as it then is.
    ///
    /// @ref adapter_operations tells what each operation does.
    ///
    /// @param root the root of the working tree
    /// @param interactor not null; shared for the adapter's life
    /// @throws std::bad_alloc
    [[nodiscard]] std::unique_ptr<CMAdapter>
    createAdapterFor(const upath &root,
                     std::shared_ptr<ApplicationInteractor> interactor) const override;

    /// A GitWorkingCopyGenerator, which the host owns. Nothing is opened.
    /// @param interactor not null; shared for the generator's life
    /// @throws std::bad_alloc
    [[nodiscard]] std::unique_ptr<WorkingCopyGenerator>
    createWorkingCopyGenerator(std::shared_ptr<ApplicationInteractor> interactor) const override;

    /// Whether this very folder is a Git repository, with or without a working tree. A folder
    /// inside a working copy is not. Looks at the folder's layout only: whether the repository can
    /// be opened, and belongs to the user, shows at an adapter's first operation. Holds a
    /// LibGit2Guard for the call. git_repository_open_ext.
    /// @throws LibGit2Exception when that can't be found out, e.g. for lack of permission to enter
    /// a folder above it; with GIT_EINVALIDSPEC for a path with a NUL character
    bool isAdapterFor(const upath &path) const override;

    /// "git".
    ustring getName() const override;
};

} // namespace vclink::git
