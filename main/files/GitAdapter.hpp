// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <memory>
#include <vector>

#include <git2/types.h>

#include "error/errorUtil/OwnedHandle.hpp"
#include "fl/filesystem/path.hpp"
#include "fl/ustring.hpp"
#include "options/GitCallbacks.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/FileStateMap.hpp"
#include "vclink/git/GitOptionsFactory.hpp"
#include "vclink/git/LibGit2Guard.hpp"

namespace vclink::git
{

class IndexLock;
struct MergeSides;

/// The back end of one working copy. Has what it needs to open the repository and to build option
/// records, and nothing of the repository itself.
class GitAdapter : public vclink::CMAdapter
{
  public:
    /// @param interactor not null
    GitAdapter(const upath &root, std::shared_ptr<ApplicationInteractor> interactor);
    /// @param factory not null, and created with an interactor
    GitAdapter(const upath &root, std::shared_ptr<GitOptionsFactory> factory);
    ~GitAdapter() override;

    /// The page adapter_operations in vclink/git/GitAdapterFactory.hpp describes each operation.
    /// @{
    void commit(const upath &folder, const ustring &message) override;
    void addFiles(const std::vector<upath> &files) override;
    void removeFiles(const std::vector<upath> &files) override;
    void revertFiles(const std::vector<upath> &files) override;
    void markResolved(const upath &file) override;
    FileStateMap getFileStates(const std::vector<upath> &files) override;
    FileStateMap getFolderStates(const upath &folder) override;
    const upath &getRootFolder() override;
    /// @}

    /// Opens the repository. The caller owns it.
    /// @throws LibGit2Exception
    [[nodiscard]] OwnedHandle<git_repository> getRepository() const;
    std::shared_ptr<GitOptionsFactory> getOptionsFactory() const;
    GitCallbacks &getCallbacks() const;
    std::shared_ptr<ApplicationInteractor> getInteractor() const;
    /// Makes commit() refuse every commit except the one that concludes this merge, and commit
    /// submodules as in the index, whatever is checked out in them.
    /// @param sides must outlive the commit; null for no merge
    void expectMerge(const MergeSides *sides) noexcept;

  private:
    FileStateMap collectFileStates(char **pathspecStrings, std::size_t pathspecCount);
    void addToIndex(const std::vector<upath> &files);
    /// Files that a sparse checkout leaves out.
    enum class LeftOutFiles
    {
        Kept,
        Removed
    };
    void removeFromIndex(const std::vector<upath> &files, LeftOutFiles leftOut);
    /// @param head one of the parents; null if HEAD has no commit
    void createCommit(git_repository *repository, const ustring &message, const git_commit *head,
                      const std::vector<const git_commit *> &parents, IndexLock &lock);
    void refreshForCommit(git_repository *repository, git_index *index, const git_commit *head,
                          const std::vector<const git_commit *> &parents) const;
    /// @return the examined states
    FileStateMap throwIfConflicted(const std::vector<upath> &files);

    // The guard is constructed first and destroyed last, after every use of libgit2 by the other
    // members.
    LibGit2Guard guard_;
    upath root_;
    std::shared_ptr<GitOptionsFactory> optionsFactory_;
    std::unique_ptr<GitCallbacks> callbacks_;
    std::shared_ptr<ApplicationInteractor> interactor_;
    /// Null except while a merge commits.
    const MergeSides *expectedMerge_ = nullptr;
};

} // namespace vclink::git
