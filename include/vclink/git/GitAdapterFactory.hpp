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
    /// Every operation opens the repository anew, and throws LibGit2Exception with libgit2's text
    /// when it can't, or when a call to libgit2 fails. Lists of files are read alike: a file that
    /// lies outside the working copy, or that Git does not know, matches nothing; the characters
    /// '*', '?' and '[' in a name act as patterns; a symbolic link means its target, one that leads
    /// nowhere itself; a folder means all below it, except the root, which matches nothing: name
    /// what is in it, or use getFolderStates for states. boost::filesystem::filesystem_error comes
    /// of a path that can't be resolved. A path with a NUL character, also in the root, is refused
    /// with GIT_EINVALIDSPEC before anything is opened.
    ///
    /// What the adapter carries out:
    /// - getFileStates: the states of the files named, one walk for the whole list. A file that Git
    ///   ignores, or that is not there, is not in the result. An empty list gives an empty map and
    ///   opens nothing. git_status_foreach_ext.
    /// - getFolderStates: the states of all files below a folder, ignored ones left out.
    ///   git_status_foreach_ext. In both state queries a walk that fails on its way raises nothing
    ///   and gives the states found so far, none for a bare repository.
    /// - addFiles: begins to track unversioned files. Raises the exception of
    ///   shared_vclink::git::AlreadyAdded, which names them, when Git knows some of the files in
    ///   whatever state; nothing is added then. git_index_add_all.
    /// - removeFiles: ends the tracking of files, which stay on the disk. Raises the exception of
    ///   shared_vclink::git::NoFilesToRemove when there is none that is not removed already.
    ///   git_index_remove_all.
    /// - markResolved: puts the file as it now stands, or its absence, in the place of what the
    ///   index has for it, a conflict included; a link that leads nowhere counts as absent.
    ///   git_index_add_all, git_index_remove_all.
    /// - commit: makes a commit on HEAD of every tracked file as it stands on the disk, staged or
    ///   not, also when nothing has changed, and concludes a merge or whatever else is under way.
    ///   The first argument is not read, the message is taken as it stands, up to a first NUL. The
    ///   author is who `user.name` and `user.email` name, otherwise "USER" or "LOGNAME" at the
    ///   host's name; raises the exception of shared_vclink::git::NoUserName when there is neither,
    ///   and boost::system::system_error when the host has no name to be found. Files in conflict
    ///   are taken as they stand, markers included. A file that a sparse checkout leaves out stays
    ///   as the index has it; one that can't be read makes the commit fail. Refuses, with the class
    ///   GIT_ERROR_MERGE and a text that names the way out, to conclude a merge whose process was
    ///   killed; nothing has changed then. After a failure HEAD, and the state of a merge, are as
    ///   before, and the index may hold the changes already; the commit stands only if the state
    ///   can't be cleaned up or the new commit can't be read.
    ///   git_index_update_all, git_commit_create, git_repository_state_cleanup.
    /// - revertFiles: throws away all changes to the files, staged or not, and brings back missing
    ///   ones; a file that HEAD does not have leaves the index and stays on the disk. As in git,
    ///   what is in the place of a listed file is deleted, including a folder with all its content;
    ///   symbolic links, FIFOs, sockets and devices are replaced. Raises the exception of
    ///   shared_vclink::git::Conflicted, which names them, when some are in conflict; nothing is
    ///   changed then. Reports progress, and ends with
    ///   vclink::util::exception::CancelledOperationException when the application asks for it
    ///   before the first file is written; the index is back at HEAD then, the files are untouched.
    ///   After any other failure of the checkout the files may be restored in part.
    ///   git_reset_default, git_checkout_index.
    /// - getRootFolder: `root`.
    /// The index on disk is written whole or not at all. Operations that change it hold git's lock,
    /// `index.lock`, from before they read it. While something else holds the lock, another
    /// operation of this process included, they throw LibGit2Exception with the code GIT_ELOCKED
    /// and the lock's name, and change nothing. The library removes no lock that it has not made.
    ///
    /// A commit tries again for `core.filesRefLockTimeout` milliseconds, 100 by default, if its
    /// branch is locked.
    ///
    /// @param root the root of the working tree
    /// @param interactor not null; shared for the adapter's life
    /// @throws std::bad_alloc
    [[nodiscard]]     std::unique_ptr<CMAdapter>
    createAdapterFor(const upath &root,
                     std::shared_ptr<ApplicationInteractor> interactor) const override;

    /// A GitWorkingCopyGenerator, which the host owns. Nothing is opened.
    /// @param interactor not null; shared for the generator's life
    /// @throws std::bad_alloc
    [[nodiscard]]     std::unique_ptr<WorkingCopyGenerator>
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
