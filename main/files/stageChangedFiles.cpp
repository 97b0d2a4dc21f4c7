// SPDX-License-Identifier: MIT
#include "main/files/stageChangedFiles.hpp"

#include <cstddef>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include <git2/diff.h>
#include <git2/index.h>
#include <git2/repository.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/files/ChangedFiles.hpp"
#include "util/path/PathspecArray.hpp"

namespace vclink::git
{
namespace
{

using OwnedDiff = std::unique_ptr<git_diff, void (*)(git_diff *)>;

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

bool isAttributesChange(const git_diff_delta &delta)
{
    return delta.status != GIT_DELTA_UNMODIFIED && isForAttributes(delta.old_file.path);
}

bool hasAttributesChange(git_diff *diff)
{
    const std::size_t count = git_diff_num_deltas(diff);
    for (std::size_t i = 0; i < count; ++i)
    {
        if (isAttributesChange(*git_diff_get_delta(diff, i)))
        {
            return true;
        }
    }
    return false;
}

/// Which of the changed files are staged.
enum class Which
{
    All,
    Emptied
};

/// One run over the changed files.
class Staging
{
  public:
    Staging(git_repository *repository, git_index *index, const ChangedFiles &files,
            HeldEntries &held)
        : repository_(repository), index_(index), files_(files), held_(held)
    {
    }

    GitResult<void> run(Which which)
    {
        std::vector<std::string> paths;
        files_.forEach([&paths](const git_index_entry &entry) { paths.emplace_back(entry.path); });
        if (paths.empty())
        {
            return boost::outcome_v2::success();
        }
        const PathspecArray pathspec(std::move(paths));
        const GitResult<OwnedDiff> diff = compare(repository_, index_, pathspec);
        if (diff.has_error())
        {
            return diff.error();
        }
        git_diff *const changes = diff.value().get();
        return stageAll(changes, hasAttributesChange(changes) ? Which::Emptied : which);
    }

  private:
    GitResult<void> stageAll(git_diff *diff, Which which)
    {
        // From the end: the entries behind one that is removed are moved up.
        for (std::size_t i = git_diff_num_deltas(diff); i > 0; --i)
        {
            const git_diff_delta &delta = *git_diff_get_delta(diff, i - 1);
            GitResult<void> staged = which == Which::All || isEmptied(delta)
                                         ? stage(delta)
                                         : boost::outcome_v2::success();
            if (staged.has_error())
            {
                return staged;
            }
        }
        return boost::outcome_v2::success();
    }

    static bool isEmptied(const git_diff_delta &delta)
    {
        return delta.status == GIT_DELTA_MODIFIED && delta.new_file.size == 0;
    }

    GitResult<void> stage(const git_diff_delta &delta)
    {
        const char *const path = delta.old_file.path;
        switch (delta.status)
        {
        case GIT_DELTA_UNMODIFIED:
            return holdUnchanged(path);
        case GIT_DELTA_DELETED:
            // Not what only can't be seen.
            return files_.isGone(path) ? call(git_index_remove_bypath, index_, path)
                                       : boost::outcome_v2::success();
        case GIT_DELTA_MODIFIED:
        case GIT_DELTA_TYPECHANGE:
            return isFileMode(delta.new_file.mode) ? call(git_index_add_bypath, index_, path)
                                                   : boost::outcome_v2::success();
        default:
            return boost::outcome_v2::success();
        }
    }

    GitResult<void> holdUnchanged(const char *path)
    {
        const git_index_entry *const entry = git_index_get_bypath(index_, path, 0);
        // A racy one is to be looked at once more when the index is written.
        return entry != nullptr && !files_.isRacy(*entry) ? held_.hold(index_, *entry)
                                                          : boost::outcome_v2::success();
    }

    git_repository *repository_;
    git_index *index_;
    const ChangedFiles &files_;
    HeldEntries &held_;
};

} // namespace

void stageChangedFiles(git_repository *repository, git_index *index, HeldEntries &held)
{
    const char *const workdir = git_repository_workdir(repository);
    if (workdir == nullptr)
    {
        return;
    }
    const ChangedFiles files(workdir, index);
    for (const Which which : {Which::All, Which::Emptied})
    {
        if (!Staging(repository, index, files, held).run(which).has_error())
        {
            return;
        }
        held.readAgain(index);
    }
}

} // namespace vclink::git
