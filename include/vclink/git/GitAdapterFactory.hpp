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
    /// What the adapter carries out:
    /// - getFileStates: the states of the files named, one walk for the whole list. A file that Git
    ///   ignores, or that is not there, is not in the result. The characters '*', '?' and '[' in a
    ///   name act as patterns; a symbolic link means its target. An empty list gives an empty map
    ///   and opens nothing.
    /// - getFolderStates: the states of all files below a folder, ignored ones left out.
    /// - getRootFolder: `root`.
    /// Both state queries throw LibGit2Exception when the repository can't be opened, and
    /// boost::filesystem::filesystem_error when a path can't be resolved. A walk that fails on its
    /// way raises nothing and gives the states found so far, none for a bare repository.
    /// git_status_foreach_ext.
    ///
    /// @param interactor not null; shared for the adapter's life
    /// @throws std::bad_alloc
    std::unique_ptr<CMAdapter>
    createAdapterFor(const upath &root,
                     std::shared_ptr<ApplicationInteractor> interactor) const override;

    /// @throws LibGit2Exception: not available in this build
    std::unique_ptr<WorkingCopyGenerator>
    createWorkingCopyGenerator(std::shared_ptr<ApplicationInteractor> interactor) const override;

    /// Whether this very folder is a Git repository, with or without a working tree. A folder
    /// inside a working copy is not. Looks at the folder's layout only: whether the repository can
    /// be opened, and belongs to the user, shows at an adapter's first operation. Holds a
    /// LibGit2Guard for the call. git_repository_open_ext.
    /// @throws LibGit2Exception when that can't be found out, e.g. for lack of permission to enter
    /// a folder above it
    bool isAdapterFor(const upath &path) const override;

    /// "git".
    ustring getName() const override;
};

} // namespace vclink::git
