// SPDX-License-Identifier: MIT
// The floor of the operations that change the repository: the same calls to libgit2, and nothing
// between them.
#define _GNU_SOURCE
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include <git2.h>

#include "bench/floor_calls.h"
#include "bench/region.h"

static int acceptAll(const char *path, const char *matched, void *payload)
{
    (void)path;
    (void)matched;
    (void)payload;
    return 0;
}

static void add(const char *root, git_strarray names)
{
    walk(root, names);
    git_repository *const repository = openRepository(root);
    git_index *index = NULL;
    check(git_repository_index(&index, repository), "git_repository_index");
    check(git_index_add_all(index, &names, GIT_INDEX_ADD_DEFAULT, acceptAll, NULL),
          "git_index_add_all");
    check(git_index_write(index), "git_index_write");
    git_index_free(index);
    git_repository_free(repository);
}

static void removeFiles(const char *root, git_strarray names)
{
    walk(root, names);
    git_repository *const repository = openRepository(root);
    git_index *index = NULL;
    check(git_repository_index(&index, repository), "git_repository_index");
    check(git_index_remove_all(index, &names, acceptAll, NULL), "git_index_remove_all");
    check(git_index_write(index), "git_index_write");
    git_index_free(index);
    git_repository_free(repository);
}

static void commit(const char *root)
{
    git_repository *const repository = openRepository(root);
    git_commit *const head = lookupHead(repository);
    if (git_repository_state(repository) != GIT_REPOSITORY_STATE_NONE)
    {
        fail("git_repository_state");
    }
    const git_commit *parents[] = {head};
    commitIndex(repository, 1, parents);
    git_commit_free(head);
    git_repository_free(repository);
}

/// Hashes and stores the listed files.
static void store(const char *root, git_strarray names)
{
    git_repository *const repository = openRepository(root);
    for (size_t i = 0; i < names.count; ++i)
    {
        git_oid id;
        check(git_blob_create_from_workdir(&id, repository, names.strings[i]),
              "git_blob_create_from_workdir");
    }
    git_repository_free(repository);
}

static void revert(const char *root, git_strarray names)
{
    size_t calls = 0;
    walk(root, names);
    git_repository *const repository = openRepository(root);
    git_object *head = NULL;
    check(git_revparse_single(&head, repository, "HEAD"), "git_revparse_single");
    check(git_reset_default(repository, head, &names), "git_reset_default");
    git_checkout_options options;
    git_checkout_options_init(&options, GIT_CHECKOUT_OPTIONS_VERSION);
    options.checkout_strategy = GIT_CHECKOUT_FORCE | GIT_CHECKOUT_RECREATE_MISSING;
    countCheckout(&options, &calls);
    options.paths = names;
    check(git_checkout_index(repository, NULL, &options), "git_checkout_index");
    git_object_free(head);
    git_repository_free(repository);
}

static void measure(const char *operation, const char *root, const char *listFile)
{
    const git_strarray names = readNames(listFile);
    beginRegion();
    if (strcmp(operation, "add") == 0)
    {
        add(root, names);
    }
    else if (strcmp(operation, "remove") == 0)
    {
        removeFiles(root, names);
    }
    else if (strcmp(operation, "revert") == 0)
    {
        revert(root, names);
    }
    else if (strcmp(operation, "store") == 0)
    {
        store(root, names);
    }
    else
    {
        commit(root);
    }
    endRegion();
    printRegion(names.count);
}

static void measureChild(const char *operation, const char *root, const char *list)
{
    setenv("BENCH_ROOT", root, 1);
    setenv("BENCH_LIST", list, 1);
    if (strcmp(operation, "add") == 0)
    {
        measureShell("exec git -C \"$BENCH_ROOT\" add --pathspec-from-file=\"$BENCH_LIST\"");
    }
    else if (strcmp(operation, "remove") == 0)
    {
        measureShell("exec git -C \"$BENCH_ROOT\" rm --quiet --cached "
                     "--pathspec-from-file=\"$BENCH_LIST\"");
    }
    else if (strcmp(operation, "revert") == 0)
    {
        measureShell("exec git -C \"$BENCH_ROOT\" restore --source=HEAD --staged --worktree "
                     "--pathspec-from-file=\"$BENCH_LIST\"");
    }
    else
    {
        measureShell("exec git -C \"$BENCH_ROOT\" commit --quiet --all --message=Change");
    }
}

int main(int argc, char **argv)
{
    return runFloor(argc, argv, "change_floor [child] add|remove|commit|revert|store ROOT LIST",
                    measure, measureChild);
}
