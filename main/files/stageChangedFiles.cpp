// SPDX-License-Identifier: MIT
#include "main/files/stageChangedFiles.hpp"

#include <cerrno>
#include <cstddef>
#include <memory>
#include <string>
#include <utility>

#include <git2/diff.h>
#include <git2/index.h>
#include <git2/repository.h>
#include <sys/stat.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/files/foldersInIndex.hpp"
#include "util/path/PathspecArray.hpp"

namespace vclink::git
{
namespace
{

using OwnedDiff = std::unique_ptr<git_diff, void (*)(git_diff *)>;

/// Compares by status and, where this is not enough, by id. Makes no patches.
GitResult<OwnedDiff> compare(git_repository *repository, git_index *index,
                             const PathspecArray &paths)
{
    git_diff_options options{};
    check(git_diff_options_init, &options, unsigned{GIT_DIFF_OPTIONS_VERSION});
    options.flags = GIT_DIFF_INCLUDE_TYPECHANGE | GIT_DIFF_INCLUDE_UNMODIFIED |
                    GIT_DIFF_IGNORE_SUBMODULES | GIT_DIFF_DISABLE_PATHSPEC_MATCH;
    options.pathspec = getArray(paths);
    git_diff *raw = nullptr;
    const GitResult<void> compared =
        call(git_diff_index_to_workdir, &raw, repository, index, &options);
    OwnedDiff diff(raw, git_diff_free);
    if (compared.has_error())
    {
        return compared.error();
    }
    return diff;
}

/// Returns false for a file that may exist and cannot be examined.
bool isGone(const std::string &path)
{
    struct stat status = {};
    return ::lstat(path.c_str(), &status) != 0 && (errno == ENOENT || errno == ENOTDIR);
}

bool isFile(const git_diff_file &file)
{
    return file.mode == GIT_FILEMODE_BLOB || file.mode == GIT_FILEMODE_BLOB_EXECUTABLE;
}

/// One run over the files.
class Staging
{
  public:
    Staging(git_repository *repository, git_index *index)
        : workdir_(git_repository_workdir(repository)), index_(index)
    {
    }

    GitResult<void> stageAll(git_diff *diff)
    {
        // From the end: libgit2 moves the entries behind one that is removed.
        for (std::size_t i = git_diff_num_deltas(diff); i > 0; --i)
        {
            GitResult<void> staged = stage(*git_diff_get_delta(diff, i - 1));
            if (staged.has_error())
            {
                return staged;
            }
        }
        return boost::outcome_v2::success();
    }

    const std::vector<std::string> &unmodified() const noexcept
    {
        return unmodified_;
    }
    const std::vector<std::string> &removed() const noexcept
    {
        return removed_;
    }

  private:
    GitResult<void> stage(const git_diff_delta &delta)
    {
        const char *const path = delta.old_file.path;
        if (delta.status == GIT_DELTA_UNMODIFIED)
        {
            unmodified_.emplace_back(path);
        }
        else if (delta.status == GIT_DELTA_MODIFIED && isFile(delta.old_file) &&
                 isFile(delta.new_file))
        {
            return call(git_index_add_bypath, index_, path);
        }
        else if (delta.status == GIT_DELTA_DELETED && isGone(workdir_ + path))
        {
            removed_.emplace_back(path);
            return call(git_index_remove_bypath, index_, path);
        }
        return boost::outcome_v2::success();
    }

    std::string workdir_;
    git_index *index_;
    std::vector<std::string> unmodified_;
    std::vector<std::string> removed_;
};

/// Whether a file with attributes has changed. Its attributes apply differently to the files that
/// are staged before it and to those after it.
bool hasOtherAttributes(git_diff *diff)
{
    const std::size_t count = git_diff_num_deltas(diff);
    for (std::size_t i = 0; i < count; ++i)
    {
        const git_diff_delta &delta = *git_diff_get_delta(diff, i);
        if (delta.status != GIT_DELTA_UNMODIFIED && isForAttributes(delta.old_file.path))
        {
            return true;
        }
    }
    return false;
}

/// Includes files with attributes even if they are not plain, because others depend on them.
std::vector<std::string> pathsOf(const std::vector<ChangedFile> &files)
{
    std::vector<std::string> paths;
    for (const ChangedFile &file : files)
    {
        if (file.isPlain || isForAttributes(file.path))
        {
            paths.push_back(file.path);
        }
    }
    return paths;
}

/// Returns the paths of the removed files.
GitResult<std::vector<std::string>> stageByPath(git_repository *repository, git_index *index,
                                                std::vector<std::string> paths, HeldEntries &held)
{
    const PathspecArray pathspec(std::move(paths));
    const GitResult<OwnedDiff> diff = compare(repository, index, pathspec);
    if (diff.has_error())
    {
        return diff.error();
    }
    Staging staging(repository, index);
    if (!hasOtherAttributes(diff.value().get()))
    {
        const GitResult<void> staged = staging.stageAll(diff.value().get());
        if (staged.has_error())
        {
            return staged.error();
        }
    }
    for (const std::string &path : staging.unmodified())
    {
        held.hold(index, path);
    }
    return staging.removed();
}

} // namespace

std::vector<std::string> stageChangedFiles(git_repository *repository, git_index *index,
                                           const ChangedFiles &changed,
                                           const std::vector<ChangedFile> &files, HeldEntries &held)
{
    std::vector<std::string> paths = pathsOf(files);
    // An index that ignores case has an order of its own, and finds entries by other names.
    if (paths.empty() || changed.dependOnOrder() || hasFilesBelowFiles(index) ||
        (git_index_caps(index) & GIT_INDEX_CAPABILITY_IGNORE_CASE) != 0)
    {
        return {};
    }
    GitResult<std::vector<std::string>> removed =
        stageByPath(repository, index, std::move(paths), held);
    if (removed.has_error())
    {
        check(git_index_read, index, int{true});
        return {};
    }
    return std::move(removed).value();
}

} // namespace vclink::git
