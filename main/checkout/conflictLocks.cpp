// SPDX-License-Identifier: MIT
#include "main/checkout/conflictLocks.hpp"

#include <algorithm>
#include <cstddef>
#include <iterator>
#include <string>

#include <git2/index.h>
#include <git2/merge.h>
#include <git2/tree.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/libgit2Release.hpp"
#include "main/checkout/gitlinks.hpp"
#include "main/checkout/obstaclesAhead.hpp"
#include "util/repository/attributes.hpp"
#include "util/repository/objectIds.hpp"

namespace vclink::git
{
namespace
{

/// Owns the result of git_merge_file_from_index.
class MergedFile
{
  public:
    MergedFile() = default;
    MergedFile(const MergedFile &) = delete;
    MergedFile &operator=(const MergedFile &) = delete;
    ~MergedFile()
    {
        git_merge_file_result_free(&result_);
    }

    git_merge_file_result *get() noexcept
    {
        return &result_;
    }

  private:
    git_merge_file_result result_{};
};

git_index_entry entryOf(const std::string &path, const git_tree_entry *side)
{
    git_index_entry entry{};
    entry.path = path.c_str();
    entry.mode = static_cast<unsigned>(git_tree_entry_filemode(side));
    entry.id = *git_tree_entry_id(side);
    return entry;
}

/// The result of a command cannot be known in advance.
bool hasCommand(git_repository *repository, const std::string &path)
{
    return git_attr_value(readAttribute(repository, path, "merge")) == GIT_ATTR_VALUE_STRING;
}

/// Returns true if the lines conflict.
bool isConflict(git_repository *repository, const git_index_entry *before,
                const git_index_entry &ours, const git_index_entry &theirs)
{
    MergedFile merged;
    check(git_merge_file_from_index, merged.get(), repository, before, &ours, &theirs, nullptr);
    return merged.get()->automergeable == 0;
}

bool isConflict(git_repository *repository, const git_index_entry &ours, const TreeChange &change)
{
    const git_index_entry theirs = entryOf(change.path, change.after);
    git_index_entry before{};
    if (change.before != nullptr)
    {
        before = entryOf(change.path, change.before);
    }
    return isConflict(repository, change.before != nullptr ? &before : nullptr, ours, theirs);
}

/// A missing tracked file is restored before the conflicts are written.
bool isThere(WorkingCopy &copy, const std::string &path, const git_tree *theirs)
{
    return copy.at(path) != Standing::Nothing || copy.entryOf(path) != nullptr ||
           findInTree(theirs, path) != nullptr;
}

/// git never takes an empty file for a renamed one, nor does libgit2 since 1.8.
constexpr bool takesEmptyForRenamed = !isLibGit2Since(1, 8);

Obstacle takenForRenamed(const std::string &path, const std::string &other)
{
    return {path, "one side has changed the empty file '" + path + "' and the other has deleted " +
                      "it, and its change would go to '" + other +
                      "', which is empty too: merge with 'git merge'"};
}

/// The bytes of an id, as a key.
std::string rawId(const git_oid &id)
{
    return {std::begin(id.id), std::end(id.id)};
}

bool hasSameLastName(const std::string &left, const std::string &right)
{
    return left.substr(left.rfind('/') + 1) == right.substr(right.rfind('/') + 1);
}

/// libgit2 pairs them in the order of their paths, git prefers those that keep their last name.
Obstacle amongSameContents(const std::string &path)
{
    return {path, "one side has changed '" + path + "', the other has renamed it or a file with " +
                      "the same content, and the change could go to the wrong one: merge with " +
                      "'git merge'"};
}

Obstacle besideLock(const std::string &path)
{
    return {path, "the conflict in '" + path + "' cannot be written beside '" + path +
                      ".lock': merge with 'git merge'"};
}

} // namespace

Finding findLockOfConflict(git_repository *repository, WorkingCopy &copy, const TreeChange &change,
                           const git_tree *theirs)
{
    const git_index_entry *const ours = copy.entryOf(change.path);
    const bool areFiles = ours != nullptr && !isGitlink(ours) && change.after != nullptr &&
                          !isGitlink(change.after) && !isGitlink(change.before);
    if (!areFiles || isOf(*ours, change.before) || isOf(*ours, change.after))
    {
        return {};
    }
    const std::string lock = change.path + ".lock";
    if (!isThere(copy, lock, theirs) ||
        (!hasCommand(repository, change.path) && !isConflict(repository, *ours, change)))
    {
        return {};
    }
    return besideLock(change.path);
}

Finding findLockBesideFile(WorkingCopy &copy, const TreeChange &change, const git_tree *theirs)
{
    const bool areFiles = change.before != nullptr && change.after != nullptr &&
                          !isGitlink(change.before) && !isGitlink(change.after);
    return areFiles && isThere(copy, change.path + ".lock", theirs) ? besideLock(change.path)
                                                                    : Finding();
}

void RenamedLocks::note(WorkingCopy &copy, const TreeChange &change)
{
    if (change.before == nullptr || isGitlink(change.before) || isGitlink(change.after))
    {
        return;
    }
    const auto fileOf = [&change](const git_tree_entry *side) {
        return File{change.path, *git_tree_entry_id(side), git_tree_entry_filemode(side)};
    };
    const git_index_entry *const ours = copy.entryOf(change.path);
    if (ours == nullptr && change.after != nullptr)
    {
        deletedByOurs_.push_back({fileOf(change.before), fileOf(change.after)});
    }
    else if (ours != nullptr && change.after == nullptr && !isOf(*ours, change.before))
    {
        const auto mode = static_cast<git_filemode_t>(ours->mode);
        deletedByTheirs_.push_back({fileOf(change.before), {change.path, ours->id, mode}});
    }
}

Finding RenamedLocks::find(git_repository *repository, WorkingCopy &copy, const git_tree *before,
                           const git_tree *theirs) const
{
    Finding found = findIn(repository, copy, before, copy.head(), theirs, deletedByOurs_);
    return found ? found : findIn(repository, copy, before, theirs, theirs, deletedByTheirs_);
}

RenamedLocks::Contents RenamedLocks::contentsOf(const std::vector<Candidate> &candidates)
{
    Contents contents;
    for (const Candidate &candidate : candidates)
    {
        if (takesEmptyForRenamed || !isEmptyBlob(candidate.before.id))
        {
            contents[rawId(candidate.before.id)].changed = candidate.before.path;
        }
    }
    return contents;
}

void RenamedLocks::noteMove(Contents &contents, const TreeChange &change)
{
    if ((change.before == nullptr) == (change.after == nullptr))
    {
        return;
    }
    const bool isAdded = change.before == nullptr;
    const auto found =
        contents.find(rawId(*git_tree_entry_id(isAdded ? change.after : change.before)));
    if (found != contents.end())
    {
        Moves &moves = found->second;
        (isAdded ? moves.added : moves.deleted).push_back(change.path);
    }
}

git_index_entry RenamedLocks::entryFor(const File &file)
{
    git_index_entry entry{};
    entry.path = file.path.c_str();
    entry.mode = file.mode;
    entry.id = file.id;
    return entry;
}

bool RenamedLocks::isInConflict(git_repository *repository, const TreeChange &change,
                                const std::vector<Candidate> &candidates)
{
    const git_index_entry renamed = entryOf(change.path, change.after);
    return std::any_of(candidates.begin(), candidates.end(),
                       [&](const Candidate &candidate)
                       {
                           const git_index_entry base = entryFor(candidate.before);
                           const git_index_entry changed = entryFor(candidate.changed);
                           return isConflict(repository, &base, renamed, changed);
                       });
}

Finding RenamedLocks::findEmptied(const TreeChange &change,
                                  const std::vector<Candidate> &candidates)
{
    if (!takesEmptyForRenamed || !isEmptyBlob(*git_tree_entry_id(change.after)))
    {
        return {};
    }
    const auto emptied =
        std::find_if(candidates.begin(), candidates.end(),
                     [](const Candidate &candidate) { return isEmptyBlob(candidate.before.id); });
    return emptied == candidates.end() ? Finding()
                                       : takenForRenamed(emptied->before.path, change.path);
}

Finding RenamedLocks::findUnclear(const Contents &contents)
{
    for (const auto &[id, moves] : contents)
    {
        const std::size_t pairs = std::min(moves.deleted.size(), moves.added.size());
        const auto deletedEnd = moves.deleted.begin() + static_cast<std::ptrdiff_t>(pairs);
        const bool isClear =
            moves.deleted.size() + moves.added.size() <= 2 ||
            std::equal(moves.deleted.begin(), deletedEnd, moves.added.begin(), hasSameLastName);
        if (!isClear)
        {
            return amongSameContents(moves.changed);
        }
    }
    return {};
}

Finding RenamedLocks::findIn(git_repository *repository, WorkingCopy &copy, const git_tree *before,
                             const git_tree *renaming, const git_tree *theirs,
                             const std::vector<Candidate> &candidates)
{
    if (candidates.empty())
    {
        return {};
    }
    Finding found;
    Contents contents = contentsOf(candidates);
    const auto look = [&](const TreeChange &change)
    {
        noteMove(contents, change);
        if (change.before != nullptr || change.after == nullptr || isGitlink(change.after))
        {
            return true;
        }
        found = findEmptied(change, candidates);
        if (!found)
        {
            const Finding obstacle = isThere(copy, change.path + ".lock", theirs)
                                         ? besideLock(change.path)
                                         : findUnwritableFolderOf(copy, change.path);
            const bool isWritten = obstacle && (hasCommand(repository, change.path) ||
                                                isInConflict(repository, change, candidates));
            found = isWritten ? obstacle : Finding();
        }
        return !found;
    };
    visitTreeChanges(repository, before, renaming, look);
    return found ? found : findUnclear(contents);
}

} // namespace vclink::git
