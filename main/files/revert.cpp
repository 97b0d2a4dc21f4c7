// SPDX-License-Identifier: MIT
// GitAdapter::revertFiles: the index back to HEAD, then the files back to the index.
#include <algorithm>
#include <cstddef>
#include <memory>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include <git2/checkout.h>
#include <git2/errors.h>
#include <git2/index.h>
#include <git2/reset.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/raise.hpp"
#include "fl/i18n/convert.hpp"
#include "main/checkout/CheckoutWatch.hpp"
#include "main/files/GitAdapter.hpp"
#include "main/files/ListedFiles.hpp"
#include "main/files/foldersInIndex.hpp"
#include "main/files/otherCase.hpp"
#include "options/gitRecords.hpp"
#include "util/lock/IndexLock.hpp"
#include "util/path/PathspecArray.hpp"
#include "util/path/paths.hpp"
#include "util/repository/Head.hpp"
#include "util/repository/repository.hpp"
#include "util/repository/settings.hpp"
#include "vclink/git/messageIdentifiers.hpp"
#include "vclink/util/generateFileReport.hpp"

namespace vclink::git
{
namespace
{

/// Returns a key of the states without the root's text, empty if it is not below the root.
std::string nameBelow(const std::string &root, const std::string &key)
{
    const bool isBelow = key.size() > root.size() && key.compare(0, root.size(), root) == 0 &&
                         (root.empty() || root.back() == '/' || key[root.size()] == '/');
    const auto begin = isBelow ? key.find_first_not_of('/', root.size()) : std::string::npos;
    return begin == std::string::npos ? std::string() : key.substr(begin);
}

/// Returns the names, relative to the root, of the changed files that HEAD has.
std::vector<std::string> changedNames(const FileStateMap &states, const upath &root)
{
    const std::string rootText = fl::i18n::ustring_to_utf8(root.string());
    std::vector<std::string> names;
    for (const auto &[path, state] : states)
    {
        const FileState::State number = state.getState();
        if (number != FileState::Clean && number != FileState::Unversioned &&
            number != FileState::Added)
        {
            names.push_back(nameBelow(rootText, fl::i18n::ustring_to_utf8(path.string())));
        }
    }
    return names;
}

bool areIndexed(git_index *index, const std::vector<std::string> &names)
{
    return std::all_of(names.begin(), names.end(),
                       [index](const std::string &name)
                       { return git_index_get_bypath(index, name.c_str(), 0) != nullptr; });
}

/// Returns true if a reset stopped in the middle of the list. A file that is restored removes what
/// was staged below its name, if these are the first entries of the index. libgit2 then fails to
/// remove them again, and stops. What is done by then need not be done again.
bool isHalfDone(const GitResult<void> &reset)
{
    return reset.has_error() && reset.error().getCode() == GIT_ENOTFOUND &&
           reset.error().getErrorClass() == GIT_ERROR_INDEX;
}

/// @param files the highest number of restored files
void resetToHead(git_repository *repository, const git_object *head, const PathspecArray &pathspec,
                 std::size_t files)
{
    GitResult<void> reset = call(git_reset_default, repository, head, getArrayPointer(pathspec));
    for (; isHalfDone(reset) && files > 0; --files)
    {
        reset = call(git_reset_default, repository, head, getArrayPointer(pathspec));
    }
    reset.value();
}

[[noreturn]] void raiseConflicted(std::vector<upath> files)
{
    raise(shared_vclink::git::Conflicted(vclink::util::generateFileReport(std::move(files))));
}

/// Returns the listed files that are in conflict.
std::vector<upath> findConflicts(git_index *index, const PathspecArray &pathspec, const upath &root)
{
    if (git_index_has_conflicts(index) == 0)
    {
        return {};
    }
    const ListedFiles listed(index, pathspec.array());
    std::set<upath> conflicted;
    ustring buffer;
    const std::size_t count = git_index_entrycount(index);
    for (std::size_t i = 0; i < count; ++i)
    {
        const git_index_entry *const entry = git_index_get_byindex(index, i);
        if (GIT_INDEX_ENTRY_STAGE(entry) != GIT_INDEX_STAGE_NORMAL && listed.contain(entry->path))
        {
            conflicted.insert(joinRepositoryPath(root, entry->path, buffer));
        }
    }
    return {conflicted.begin(), conflicted.end()};
}

void resetEntries(git_repository *repository, git_index *index, const git_object *head,
                  const PathspecArray &pathspec, const FileStateMap &states, const upath &root)
{
    const std::vector<std::string> names = changedNames(states, root);
    resetToHead(repository, head, pathspec, names.size());
    // If a file became a link in the index, or a link a file, the first reset removes it from the
    // index and the second one restores it.
    if (head != nullptr && !areIndexed(index, names))
    {
        resetToHead(repository, head, pathspec, names.size());
    }
    if (takeOutBelowFiles(index, pathspec))
    {
        writeIndex(index);
    }
}

/// Throws the failure that has kept HEAD from being read, unless there is no commit yet. The index
/// lacks the listed files then: a checkout would succeed and restore none of them.
void refuseUnreadableHead(git_repository *repository,
                          const GitResult<OwnedHandle<git_object>> &head)
{
    if (!head.has_value() && lookupHead(repository) != nullptr)
    {
        static_cast<void>(head.value());
    }
}

} // namespace

FileStateMap GitAdapter::throwIfConflicted(const std::vector<upath> &files)
{
    FileStateMap states = getFileStates(files);
    std::vector<upath> conflicted;
    for (const auto &[path, state] : states)
    {
        if (state.getState() == FileState::InConflict)
        {
            conflicted.push_back(path);
        }
    }
    if (!conflicted.empty())
    {
        raiseConflicted(std::move(conflicted));
    }
    return states;
}

void GitAdapter::revertFiles(const std::vector<upath> &files)
{
    const FileStateMap states = throwIfConflicted(files);
    if (files.empty())
    {
        return;
    }
    const PathspecArray pathspec = makeFilePathspec(files, root_);
    const OwnedHandle<git_repository> repository = openWorkingCopy(root_);
    refuseUnreadableSettings(repository.get());
    IndexLock lock(repository.get());
    // Without a HEAD the reset removes the paths from the index.
    const GitResult<OwnedHandle<git_object>> head = revparseObject(repository.get(), "HEAD");
    // The index of the resets and the checkout. Without this call it would be empty if libgit2
    // cannot read the index file, and would then have only these entries.
    const OwnedHandle<git_index> index = getRepositoryIndex(repository.get());
    refuseOtherCase(index.get(), pathspec.array());
    // Another process may have brought a file into conflict since the states were read. Without
    // states, because they could not be read, none was in conflict.
    std::vector<upath> conflicted = findConflicts(index.get(), pathspec, root_);
    if (!conflicted.empty() && throwIfConflicted(files).empty())
    {
        raiseConflicted(std::move(conflicted));
    }
    resetEntries(repository.get(), index.get(), head.has_value() ? head.value().get() : nullptr,
                 pathspec, states, root_);
    refuseUnreadableHead(repository.get(), head);
    const std::shared_ptr<GitOptionsFactory> factory = optionsFactory_;
    CheckoutOptions options = factory->makeCheckoutOptions();
    options.checkoutStrategy = GIT_CHECKOUT_FORCE | GIT_CHECKOUT_RECREATE_MISSING;
    git_checkout_options record = toGitCheckoutOptions(options, callbacks_->checkoutCallbacks());
    record.paths = getArray(pathspec);
    // The listed files are the same in HEAD and in the index now. If libgit2 compared the two, it
    // could take one of these files for another one with the same content that is a folder in the
    // index, and remove it. It would also remove them if another process makes the first commit
    // now.
    record.baseline_index = index.get();
    const CheckoutWatch watch(CheckoutKind::Revert, repository.get(), record);
    const GitResult<void> restored = call(git_checkout_index, repository.get(), nullptr, &record);
    if (watch.hasRefused())
    {
        lock.discard();
    }
    check(restored);
    watch.settle();
    lock.publish();
}

} // namespace vclink::git
