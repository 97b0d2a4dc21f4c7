// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>
#include <vector>

#include "error/errorUtil/OwnedHandle.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/LogCapture.hpp"
#include "support/NothingLeft.hpp"
#include "support/Scripts.hpp"
#include "util/GitMergeDriverLookup.hpp"

namespace vclink::test
{

/// Whether a merge may leave temporary files; the test's folder is emptied of them then.
enum class TemporaryFiles
{
    Go,
    Stay
};

/// A repository opened for the merge of its branch "theirs".
class OpenedMerge
{
  public:
    explicit OpenedMerge(const GitRepository &repository);

    /// git_merge, as the library calls it. Allocates nothing with operator new by itself.
    /// @return its code
    int run() const;

  private:
    git::OwnedHandle<git_repository> repository_;
    git::OwnedHandle<git_annotated_commit> theirs_;
};

/// Base of the fixtures whose tests merge with the library's driver registered: git_merge is called
/// on a repository whose branch "theirs" is to be merged into "main".
class MergeDriverFixture : public GitFixture
{
  protected:
    ~MergeDriverFixture() override;

    /// Defines the command of a driver in the repository's configuration.
    void define(const std::string &driver, const std::string &command) const;
    /// The same with a script of the shell and "%O %A %B %L %P".
    void defineScript(const std::string &driver, const std::string &script);

    /// Commits what `base`, `ours` and `theirs` do to the working copy, each on the one before, the
    /// last two on branches of their own.
    void diverge(const std::function<void()> &base, const std::function<void()> &ours,
                 const std::function<void()> &theirs);
    /// Conflicts in all of these files, under these attributes.
    void makeConflicts(const std::vector<std::string> &names, const std::string &attributes);
    /// A conflict in "file", whose merge attribute names `driver`.
    void makeConflict(const std::string &driver = "tool");

    /// git_merge, as the library calls it. Checks that nothing stays behind.
    /// @return its code
    int merge(TemporaryFiles files = TemporaryFiles::Go) const;
    /// The same; throws a failure.
    void mergeOrThrow() const;

    /// The content of the index, a line for each entry: mode, stage, name, tab-separated.
    std::vector<std::string> index() const;
    /// The bytes of an entry in the index.
    std::string staged(const std::string &name, int stage = 0) const;
    bool isInConflict(const std::string &name) const;

    GitRepository repository_ = makeRepository();
    Scripts scripts_{folder() / "scripts"};
    LibGit2Session session_{environment()};
    git::GitMergeDriverLookup drivers_ = git::registerMergeDrivers();
};

} // namespace vclink::test
