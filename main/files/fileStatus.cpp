// SPDX-License-Identifier: MIT
// GitAdapter::getFileStates and getFolderStates: one status walk each.
#include <memory>
#include <utility>

#include <git2/status.h>

#include "error/errorUtil/GitResult.hpp"
#include "main/files/GitAdapter.hpp"
#include "main/files/StatusCallbacks.hpp"
#include "options/Callbacks.hpp"
#include "options/gitRecords.hpp"
#include "util/path/PathspecArray.hpp"
#include "util/repository/fatalPatterns.hpp"
#include "util/repository/repository.hpp"
#include "vclink/git/StatusOptions.hpp"

namespace vclink::git
{
namespace
{

git_status_options toGitStatusOptions(const StatusOptions & /*options*/)
{
    git_status_options record =
        initGitRecord(git_status_options_init, unsigned{GIT_STATUS_OPTIONS_VERSION});
    record.show = GIT_STATUS_SHOW_INDEX_AND_WORKDIR;
    record.flags = GIT_STATUS_OPT_INCLUDE_UNTRACKED | GIT_STATUS_OPT_INCLUDE_UNMODIFIED |
                   GIT_STATUS_OPT_RECURSE_UNTRACKED_DIRS | GIT_STATUS_OPT_RENAMES_HEAD_TO_INDEX;
    return record;
}

} // namespace

FileStateMap GitAdapter::getFileStates(const std::vector<upath> &files)
{
    if (files.empty())
    {
        return FileStateMap();
    }
    const PathspecArray pathspec = makeFilePathspec(files, root_);
    return collectFileStates(pathspec.array().strings, pathspec.array().count);
}

FileStateMap GitAdapter::getFolderStates(const upath &folder)
{
    const PathspecArray pathspec = makeFolderPathspec(folder, root_);
    return collectFileStates(pathspec.array().strings, pathspec.array().count);
}

FileStateMap GitAdapter::collectFileStates(char **pathspecStrings, std::size_t pathspecCount)
{
    const std::shared_ptr<GitOptionsFactory> factory = optionsFactory_;
    const StatusOptions options = factory->makeStatusOptions();
    StatusCallbacks callbacks(root_);
    git_status_options record = toGitStatusOptions(options);
    record.pathspec = {pathspecStrings, pathspecCount};
    const OwnedHandle<git_repository> repository = openWorkingCopy(root_);
    refuseFatalPatternsInFolders(repository.get());
    // Intentionally ignored: the caller gets the states up to the failure of the walk.
    static_cast<void>(call(git_status_foreach_ext, repository.get(), &record,
                           makeCallback<&StatusCallbacks::status, git_status_cb>(), &callbacks));
    return std::move(callbacks.states);
}

} // namespace vclink::git
