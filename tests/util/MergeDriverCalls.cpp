// SPDX-License-Identifier: MIT
#include "MergeDriverCalls.hpp"

#include "support/interposition.hpp"

namespace
{

vclink::test::MergeDriverCalls *current = nullptr;

void note(const char *name)
{
    if (current == nullptr)
        return;
    current->names.emplace_back(name);
    if (current->onCall)
        current->onCall(name);
}

/// Whether the test answers in libgit2's place.
bool answers(const std::function<int()> vclink::test::MergeDriverCalls::*answer)
{
    return current != nullptr && current->*answer;
}

} // namespace

namespace vclink::test
{

MergeDriverCalls::MergeDriverCalls()
{
    current = this;
}

MergeDriverCalls::~MergeDriverCalls()
{
    current = nullptr;
}

} // namespace vclink::test

using vclink::test::findNext;
using vclink::test::MergeDriverCalls;

const git_index_entry *git_merge_driver_source_ancestor(const git_merge_driver_source *)
{
    note("ancestor");
    return current->ancestor;
}

const git_index_entry *git_merge_driver_source_ours(const git_merge_driver_source *)
{
    note("ours");
    return current->ours;
}

const git_index_entry *git_merge_driver_source_theirs(const git_merge_driver_source *)
{
    note("theirs");
    return current->theirs;
}

const git_merge_file_options *git_merge_driver_source_file_options(const git_merge_driver_source *)
{
    note("file_options");
    return &current->options;
}

git_repository *git_merge_driver_source_repo(const git_merge_driver_source *)
{
    note("repo");
    return current->repository;
}

int git_repository_config_snapshot(git_config **out, git_repository *repository)
{
    note("config_snapshot");
    if (answers(&MergeDriverCalls::onSnapshot))
        return current->onSnapshot();
    return findNext<decltype(git_repository_config_snapshot)>("git_repository_config_snapshot")(
        out, repository);
}

int git_config_get_entry(git_config_entry **out, const git_config *config, const char *name)
{
    note("get_entry");
    if (answers(&MergeDriverCalls::onGetEntry))
        return current->onGetEntry();
    return findNext<decltype(git_config_get_entry)>("git_config_get_entry")(out, config, name);
}

void git_config_entry_free(git_config_entry *entry)
{
    note("entry_free");
    findNext<decltype(git_config_entry_free)>("git_config_entry_free")(entry);
}

void git_config_free(git_config *config)
{
    note("config_free");
    findNext<decltype(git_config_free)>("git_config_free")(config);
}

int git_repository_odb(git_odb **out, git_repository *repository)
{
    note("odb");
    return findNext<decltype(git_repository_odb)>("git_repository_odb")(out, repository);
}

int git_odb_read(git_odb_object **out, git_odb *database, const git_oid *id)
{
    note("odb_read");
    if (answers(&MergeDriverCalls::onReadBlob))
    {
        const int code = current->onReadBlob();
        if (code != 0)
            return code;
    }
    return findNext<decltype(git_odb_read)>("git_odb_read")(out, database, id);
}

void git_odb_object_free(git_odb_object *object)
{
    note("object_free");
    findNext<decltype(git_odb_object_free)>("git_odb_object_free")(object);
}

void git_odb_free(git_odb *database)
{
    note("odb_free");
    findNext<decltype(git_odb_free)>("git_odb_free")(database);
}

int git_buf_set(git_buf *buffer, const void *data, size_t size)
{
    note("buf_set");
    if (answers(&MergeDriverCalls::onSetBuffer))
        return current->onSetBuffer();
    return findNext<decltype(git_buf_set)>("git_buf_set")(buffer, data, size);
}

int git_merge_driver_register(const char *name, git_merge_driver *driver)
{
    note("register");
    if (answers(&MergeDriverCalls::onRegister))
        return current->onRegister();
    return findNext<decltype(git_merge_driver_register)>("git_merge_driver_register")(name, driver);
}

int git_merge_driver_unregister(const char *name)
{
    note("unregister");
    if (answers(&MergeDriverCalls::onUnregister))
        return current->onUnregister();
    return findNext<decltype(git_merge_driver_unregister)>("git_merge_driver_unregister")(name);
}

int git_libgit2_init()
{
    note("init");
    return findNext<decltype(git_libgit2_init)>("git_libgit2_init")();
}

int git_libgit2_shutdown()
{
    note("shutdown");
    return findNext<decltype(git_libgit2_shutdown)>("git_libgit2_shutdown")();
}
