// SPDX-License-Identifier: MIT
#include "Snapshot.hpp"

#include <array>
#include <cstdint>
#include <sstream>
#include <vector>

#include <git2.h>
#include <sys/stat.h>

#include "error/errorUtil/GitResult.hpp"
#include "support/readFile.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;
using git::acquire;

/// Without AUTO_MERGE, which git leaves where it ends a merge.
constexpr std::array filesUnderWay{
    "MERGE_HEAD",   "MERGE_MSG",  "MERGE_MODE", "CHERRY_PICK_HEAD", "REVERT_HEAD",
    "vclink-merge", "index.lock", "HEAD.lock",  "config.lock",      "packed-refs.lock"};

/// The git folder of a working tree, and the one that it shares with others or is its own.
struct GitFolders
{
    fs::path own;
    fs::path shared;

    bool isLinked() const
    {
        return own != shared;
    }
};

GitFolders foldersOf(git_repository *repository)
{
    const auto pathOf = [](const std::string &folder) { return fs::path(folder).parent_path(); };
    return {pathOf(git_repository_path(repository)), pathOf(git_repository_commondir(repository))};
}

std::string describeStamp(const struct stat &status)
{
    return std::to_string(status.st_ino) + ' ' + std::to_string(status.st_mtim.tv_sec) + '.' +
           std::to_string(status.st_mtim.tv_nsec);
}

void readEntry(const fs::path &path, const std::string &name, Snapshot &snapshot)
{
    struct stat status = {};
    if (::lstat(path.c_str(), &status) != 0)
        return;
    std::ostringstream text;
    text << std::oct << status.st_mode;
    if (S_ISREG(status.st_mode) || S_ISLNK(status.st_mode))
    {
        const std::string bytes =
            S_ISREG(status.st_mode) ? readFile(path) : fs::read_symlink(path).string();
        text << ' ' << bytes;
        snapshot.fileIds[name] = blobIdOf(bytes);
    }
    snapshot.files[name] = text.str();
    if (!S_ISDIR(status.st_mode))
        snapshot.stamps[name] = describeStamp(status);
}

void readFiles(const fs::path &copy, const fs::path &folder, const fs::path &shared,
               Snapshot &snapshot)
{
    const fs::path own = copy / ".git";
    for (fs::recursive_directory_iterator entry(folder), end; entry != end; ++entry)
    {
        if (entry->path() == own || entry->path() == shared)
        {
            entry.disable_recursion_pending();
            continue;
        }
        // It holds times, which no two working copies share.
        if (entry->path().filename() == "index" && entry->path().parent_path().filename() == ".git")
            continue;
        readEntry(entry->path(), entry->path().lexically_relative(folder).string(), snapshot);
    }
}

void readIndex(git_repository *repository, Snapshot &snapshot)
{
    const auto index = acquire<git_index>(git_repository_index, repository).value();
    for (std::size_t at = 0; at < git_index_entrycount(index.get()); ++at)
    {
        const git_index_entry *const entry = git_index_get_byindex(index.get(), at);
        const std::string id = git_oid_tostr_s(&entry->id);
        std::ostringstream text;
        text << std::oct << entry->mode << ' ' << id;
        text << ((entry->flags_extended & GIT_INDEX_ENTRY_SKIP_WORKTREE) != 0 ? " left out" : "");
        text << ((entry->flags & GIT_INDEX_ENTRY_VALID) != 0 ? " assumed unchanged" : "");
        const int stage = git_index_entry_stage(entry);
        snapshot.index[entry->path + (" " + std::to_string(stage))] = text.str();
        snapshot.indexIds.insert(id);
    }
}

std::string describeCommit(const git_commit *commit)
{
    std::string text = "tree " + std::string(git_oid_tostr_s(git_commit_tree_id(commit)));
    for (unsigned at = 0; at < git_commit_parentcount(commit); ++at)
        text += " parent " + std::string(git_oid_tostr_s(git_commit_parent_id(commit, at)));
    return text;
}

void readHistory(git_repository *repository, Snapshot &snapshot)
{
    const auto record = [&](const std::string &name, const git_reference *reference)
    {
        const git_oid *const id = git_reference_target(reference);
        if (id == nullptr)
        {
            snapshot.history[name] = git_reference_symbolic_target(reference);
            return;
        }
        const auto commit = acquire<git_commit>(git_commit_lookup, repository, id).value();
        snapshot.history[name] = describeCommit(commit.get());
    };
    record("HEAD", acquire<git_reference>(git_reference_lookup, repository, "HEAD").value().get());
    git_strarray names{};
    git_reference_list(&names, repository);
    for (std::size_t at = 0; at < names.count; ++at)
        record(names.strings[at],
               acquire<git_reference>(git_reference_lookup, repository, names.strings[at])
                   .value()
                   .get());
    git_strarray_dispose(&names);
}

void readUnderWay(const fs::path &gitFolder, const std::string &prefix, Snapshot &snapshot)
{
    for (const auto *name : filesUnderWay)
        if (fs::exists(gitFolder / name))
            snapshot.underWay[prefix + name] = "there";
}

/// What an operation in a linked working tree leaves alone.
void readMainTree(const fs::path &gitFolder, Snapshot &snapshot)
{
    snapshot.history["main HEAD"] = readFile(gitFolder / "HEAD");
    struct stat status = {};
    if (::stat((gitFolder / "index").c_str(), &status) == 0)
        snapshot.stamps["main index"] = describeStamp(status);
}

int collectId(const char * /*root*/, const git_tree_entry *entry, void *payload)
{
    static_cast<std::set<std::string> *>(payload)->insert(
        git_oid_tostr_s(git_tree_entry_id(entry)));
    return 0;
}

std::vector<git_oid> tipsOf(git_repository *repository)
{
    git_strarray names{};
    git_reference_list(&names, repository);
    std::vector<std::string> references(names.strings, names.strings + names.count);
    git_strarray_dispose(&names);
    references.emplace_back("HEAD");
    std::vector<git_oid> tips;
    for (const auto &name : references)
    {
        git_oid id{};
        if (git_reference_name_to_id(&id, repository, name.c_str()) == 0)
            tips.push_back(id);
    }
    return tips;
}

std::set<std::string> contentsOf(const fs::path &copy, bool isWithHistory)
{
    const auto repository = acquire<git_repository>(git_repository_open, copy.c_str()).value();
    std::set<std::string> ids;
    std::vector<git_oid> commits = tipsOf(repository.get());
    while (!commits.empty())
    {
        const git_oid id = commits.back();
        commits.pop_back();
        if (!ids.insert(git_oid_tostr_s(&id)).second)
            continue;
        const auto commit = acquire<git_commit>(git_commit_lookup, repository.get(), &id).value();
        for (unsigned at = 0; isWithHistory && at < git_commit_parentcount(commit.get()); ++at)
            commits.push_back(*git_commit_parent_id(commit.get(), at));
        const auto tree = acquire<git_tree>(git_commit_tree, commit.get()).value();
        git_tree_walk(tree.get(), GIT_TREEWALK_PRE, collectId, &ids);
    }
    return ids;
}

void compare(const char *what, const Snapshot::Entries &left, const Snapshot::Entries &right,
             std::string &text)
{
    auto names = left;
    names.insert(right.begin(), right.end());
    for (const auto &[name, ignored] : names)
    {
        const auto valueIn = [&path = name](const Snapshot::Entries &entries)
        { return entries.count(path) == 0 ? std::string("nothing") : entries.at(path); };
        if (valueIn(left) != valueIn(right))
            text += std::string("  ") + what + ' ' + name + ": " + valueIn(left) + " -> " +
                    valueIn(right) + '\n';
    }
}

} // namespace

std::string blobIdOf(const std::string &bytes)
{
    git_oid id{};
    git_odb_hash(&id, bytes.data(), bytes.size(), GIT_OBJECT_BLOB);
    return git_oid_tostr_s(&id);
}

Snapshot takeSnapshot(const fs::path &copy, const fs::path &folder)
{
    Snapshot snapshot;
    const auto repository = acquire<git_repository>(git_repository_open, copy.c_str()).value();
    const GitFolders folders = foldersOf(repository.get());
    readFiles(copy, folder, folders.shared, snapshot);
    readIndex(repository.get(), snapshot);
    readHistory(repository.get(), snapshot);
    readUnderWay(folders.own, "", snapshot);
    if (folders.isLinked())
    {
        readUnderWay(folders.shared, "main ", snapshot);
        readMainTree(folders.shared, snapshot);
    }
    return snapshot;
}

std::set<std::string> committedContents(const fs::path &copy)
{
    return contentsOf(copy, true);
}

std::set<std::string> tipContents(const fs::path &copy)
{
    return contentsOf(copy, false);
}

std::set<std::string> lostOf(std::set<std::string> contents, const Snapshot &after,
                             const fs::path &copy)
{
    for (const auto &[name, id] : after.fileIds)
        contents.erase(id);
    for (const auto &id : after.indexIds)
        contents.erase(id);
    if (!contents.empty())
        for (const auto &id : committedContents(copy))
            contents.erase(id);
    return contents;
}

std::string differenceOf(const Snapshot &left, const Snapshot &right)
{
    std::string text;
    compare("file", left.files, right.files, text);
    compare("index", left.index, right.index, text);
    compare("history", left.history, right.history, text);
    compare("under way", left.underWay, right.underWay, text);
    return text;
}

std::string changeOf(const Snapshot &before, const Snapshot &after)
{
    std::string text = differenceOf(before, after);
    compare("stamp", before.stamps, after.stamps, text);
    return text;
}

} // namespace vclink::test
