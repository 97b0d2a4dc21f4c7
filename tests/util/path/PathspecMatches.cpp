// SPDX-License-Identifier: MIT
#include "PathspecMatches.hpp"

#include <filesystem>
#include <stdexcept>
#include <utility>

#include <git2.h>

#include "error/errorUtil/OwnedHandle.hpp"

namespace vclink::test
{
namespace
{

using git::getArray;
using git::getArrayPointer;
using git::OwnedHandle;
using git::PathspecArray;
using Names = std::set<std::string>;

void check(int code, const char *call)
{
    if (code < 0)
        throw std::runtime_error(std::string(call) + ": " + git_error_last()->message);
}

struct OpenRepository
{
    explicit OpenRepository(const GitRepository &repository)
    {
        git_repository *opened = nullptr;
        check(git_repository_open(&opened, repository.path().c_str()), "open");
        handle.reset(opened);
        git_index *read = nullptr;
        check(git_repository_index(&read, opened), "index");
        index.reset(read);
    }
    Names entries() const
    {
        Names names;
        for (std::size_t i = 0; i < git_index_entrycount(index.get()); ++i)
            names.insert(git_index_get_byindex(index.get(), i)->path);
        return names;
    }

    OwnedHandle<git_repository> handle;
    OwnedHandle<git_index> index;
};

Names difference(const Names &all, const Names &left)
{
    Names gone;
    for (const auto &name : all)
    {
        if (left.count(name) == 0)
            gone.insert(name);
    }
    return gone;
}

int noteName(const char *path, unsigned, void *names)
{
    static_cast<Names *>(names)->insert(path);
    return 0;
}

OwnedHandle<git_object> head(git_repository *repository)
{
    git_object *object = nullptr;
    check(git_revparse_single(&object, repository, "HEAD"), "HEAD");
    return OwnedHandle<git_object>(object);
}

/// Makes every entry's content another than that of the tree.
git_oid changeEveryEntry(const OpenRepository &repository)
{
    git_oid other;
    const std::string text = "what no file of the tree holds";
    check(git_blob_create_from_buffer(&other, repository.handle.get(), text.data(), text.size()),
          "blob");
    for (const auto &name : repository.entries())
    {
        git_index_entry entry = *git_index_get_bypath(repository.index.get(), name.c_str(), 0);
        entry.id = other;
        entry.mtime = {};
        check(git_index_add(repository.index.get(), &entry), "index entry");
    }
    return other;
}

} // namespace

PathspecMatches::PathspecMatches(const GitRepository &repository) : repository_(repository)
{
}

Names PathspecMatches::inStatus(const PathspecArray &pathspec) const
{
    const OpenRepository repository(repository_);
    git_status_options options;
    check(git_status_options_init(&options, GIT_STATUS_OPTIONS_VERSION), "status options");
    options.flags = GIT_STATUS_OPT_INCLUDE_UNTRACKED | GIT_STATUS_OPT_INCLUDE_UNMODIFIED |
                    GIT_STATUS_OPT_RECURSE_UNTRACKED_DIRS;
    options.pathspec = getArray(pathspec);
    Names names;
    check(git_status_foreach_ext(repository.handle.get(), &options, noteName, &names), "status");
    return names;
}

Names PathspecMatches::inAddAll(const PathspecArray &pathspec) const
{
    const OpenRepository repository(repository_);
    check(git_index_clear(repository.index.get()), "clear");
    check(git_index_add_all(repository.index.get(), getArrayPointer(pathspec),
                            GIT_INDEX_ADD_DEFAULT, nullptr, nullptr),
          "add_all");
    return repository.entries();
}

Names PathspecMatches::inRemoveAll(const PathspecArray &pathspec) const
{
    const OpenRepository repository(repository_);
    const Names before = repository.entries();
    check(git_index_remove_all(repository.index.get(), getArrayPointer(pathspec), nullptr, nullptr),
          "remove_all");
    return difference(before, repository.entries());
}

Names PathspecMatches::inUpdateAll(const PathspecArray &pathspec) const
{
    const OpenRepository repository(repository_);
    const git_oid other = changeEveryEntry(repository);
    check(git_index_update_all(repository.index.get(), getArrayPointer(pathspec), nullptr, nullptr),
          "update_all");
    Names refreshed;
    for (const auto &name : repository.entries())
    {
        const auto *entry = git_index_get_bypath(repository.index.get(), name.c_str(), 0);
        if (git_oid_equal(&entry->id, &other) == 0)
            refreshed.insert(name);
    }
    return refreshed;
}

Names PathspecMatches::inResetDefault(const PathspecArray &pathspec) const
{
    const std::string indexFile = repository_.read(".git/index");
    const OpenRepository repository(repository_);
    check(git_index_clear(repository.index.get()), "clear");
    const auto target = head(repository.handle.get());
    check(git_reset_default(repository.handle.get(), target.get(), getArrayPointer(pathspec)),
          "reset_default");
    Names names = repository.entries();
    repository_.write(".git/index", indexFile);
    return names;
}

Names PathspecMatches::inCheckoutIndex(const PathspecArray &pathspec) const
{
    const OpenRepository repository(repository_);
    const Names all = repository.entries();
    for (const auto &name : all)
        repository_.remove(name);
    git_checkout_options options;
    check(git_checkout_options_init(&options, GIT_CHECKOUT_OPTIONS_VERSION), "checkout options");
    options.checkout_strategy = GIT_CHECKOUT_FORCE | GIT_CHECKOUT_DONT_UPDATE_INDEX;
    options.paths = getArray(pathspec);
    check(git_checkout_index(repository.handle.get(), nullptr, &options), "checkout_index");
    Names written;
    for (const auto &name : all)
    {
        if (std::filesystem::exists(repository_ / name))
            written.insert(name);
    }
    options.paths = {};
    check(git_checkout_index(repository.handle.get(), nullptr, &options), "checkout_index");
    return written;
}

std::vector<PathspecMatches::Answer>
PathspecMatches::inEveryCall(const PathspecArray &pathspec) const
{
    return {{"git_status_foreach_ext", inStatus(pathspec)},
            {"git_index_add_all", inAddAll(pathspec)},
            {"git_index_remove_all", inRemoveAll(pathspec)},
            {"git_index_update_all", inUpdateAll(pathspec)},
            {"git_reset_default", inResetDefault(pathspec)},
            {"git_checkout_index", inCheckoutIndex(pathspec)}};
}

} // namespace vclink::test
