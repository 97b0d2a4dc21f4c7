// SPDX-License-Identifier: MIT
#include "main/files/holdChangedFiles.hpp"

#include <cstdint>
#include <memory>
#include <string>

#include <git2/index.h>
#include <git2/pathspec.h>
#include <git2/repository.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/files/ChangedFiles.hpp"

namespace vclink::git
{
namespace
{

/// The changed files that git_index_add_all would only compare.
class Bystanders
{
  public:
    Bystanders(git_index *index, const git_strarray &listed) : index_(index), listed_(listed)
    {
    }

    GitResult<void> hold(const ChangedFiles &files, HeldEntries &held)
    {
        GitResult<void> result = boost::outcome_v2::success();
        files.forEach(
            [&](const git_index_entry &entry)
            {
                if (!result.has_error())
                {
                    result = holdOne(files, entry, held);
                }
            });
        return result;
    }

  private:
    bool isListed(const git_index_entry &entry)
    {
        if (pathspec_ == nullptr)
        {
            git_pathspec *raw = nullptr;
            const GitResult<void> parsed = call(git_pathspec_new, &raw, &listed_);
            pathspec_.reset(raw);
            check(parsed);
            const bool isCaseIgnored =
                (git_index_caps(index_) & GIT_INDEX_CAPABILITY_IGNORE_CASE) != 0;
            flags_ = isCaseIgnored ? GIT_PATHSPEC_IGNORE_CASE : GIT_PATHSPEC_DEFAULT;
        }
        return git_pathspec_matches_path(pathspec_.get(), flags_, entry.path) != 0;
    }

    GitResult<void> holdOne(const ChangedFiles &files, const git_index_entry &entry,
                            HeldEntries &held)
    {
        if (isListed(entry))
        {
            return files.isEmptied(entry)
                       ? call(git_index_add_bypath, index_, std::string(entry.path).c_str())
                       : boost::outcome_v2::success();
        }
        // A racy one is to be looked at once more when the index is written, unless its size tells.
        return !files.isRacy(entry) || files.isOtherSize(entry) ? held.hold(index_, entry)
                                                                : boost::outcome_v2::success();
    }

    git_index *index_;
    const git_strarray &listed_;
    /// Made once a file has changed.
    std::unique_ptr<git_pathspec, void (*)(git_pathspec *)> pathspec_{nullptr, git_pathspec_free};
    std::uint32_t flags_ = GIT_PATHSPEC_DEFAULT;
};

} // namespace

void holdChangedFiles(git_repository *repository, git_index *index, const git_strarray &listed,
                      HeldEntries &held)
{
    const char *const workdir = git_repository_workdir(repository);
    if (workdir == nullptr)
    {
        return;
    }
    const ChangedFiles files(workdir, index);
    if (Bystanders(index, listed).hold(files, held).has_error())
    {
        held.readAgain(index);
    }
}

} // namespace vclink::git
