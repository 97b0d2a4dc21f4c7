// SPDX-License-Identifier: MIT
// The floor of the branch operations: the same calls to libgit2, and nothing between them.
#define _GNU_SOURCE
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include <dlfcn.h>
#include <git2.h>

#include "bench/floor_calls.h"
#include "bench/floor_driver.h"
#include "bench/region.h"

static size_t listBranches(const char *root)
{
    size_t count = 0;
    size_t bytes = 0;
    git_repository *const repository = openRepository(root);
    git_branch_iterator *iterator = NULL;
    git_reference *reference = NULL;
    git_branch_t type;
    check(git_branch_iterator_new(&iterator, repository, GIT_BRANCH_LOCAL),
          "git_branch_iterator_new");
    while (git_branch_next(&reference, &type, iterator) == 0)
    {
        bytes += strlen(git_reference_name(reference));
        ++count;
        git_reference_free(reference);
    }
    git_branch_iterator_free(iterator);
    git_repository_free(repository);
    return bytes == 0 ? 0 : count;
}

/// Deletes the first so many of the branches that the bench makes, each with a repository of its
/// own.
static size_t deleteBranches(const char *root, const char *count)
{
    const size_t all = strtoul(count, NULL, 10);
    for (size_t number = 0; number < all; ++number)
    {
        char name[32];
        git_reference *branch = NULL;
        git_repository *const repository = openRepository(root);
        snprintf(name, sizeof name, "topic-%05zu", number);
        check(git_branch_lookup(&branch, repository, name, GIT_BRANCH_LOCAL), "git_branch_lookup");
        check(git_branch_delete(branch), "git_branch_delete");
        git_reference_free(branch);
        git_repository_free(repository);
    }
    return all;
}

/// Asks each of these branches for its commit.
static size_t readRevisions(const char *root, const char *count)
{
    const size_t all = strtoul(count, NULL, 10);
    size_t bytes = 0;
    for (size_t number = 0; number < all; ++number)
    {
        char name[32];
        char digits[GIT_OID_HEXSZ + 1];
        git_object *object = NULL;
        git_repository *const repository = openRepository(root);
        snprintf(name, sizeof name, "topic-%05zu", number);
        check(git_revparse_single(&object, repository, name), "git_revparse_single");
        bytes += strlen(git_oid_tostr(digits, sizeof digits, git_object_id(object)));
        git_object_free(object);
        git_repository_free(repository);
    }
    return bytes == 0 ? 0 : all;
}

static git_checkout_options makeCheckoutOptions(unsigned strategy, size_t *calls)
{
    git_checkout_options options;
    git_checkout_options_init(&options, GIT_CHECKOUT_OPTIONS_VERSION);
    options.checkout_strategy = strategy;
    countCheckout(&options, calls);
    return options;
}

static void switchBranch(const char *root, const char *name)
{
    size_t calls = 0;
    git_repository *const repository = openRepository(root);
    git_reference *branch = NULL;
    git_object *target = NULL;
    check(git_branch_lookup(&branch, repository, name, GIT_BRANCH_LOCAL), "git_branch_lookup");
    check(git_revparse_single(&target, repository, name), "git_revparse_single");
    const git_checkout_options options = makeCheckoutOptions(GIT_CHECKOUT_SAFE, &calls);
    check(git_checkout_tree(repository, target, &options), "git_checkout_tree");
    check(git_repository_set_head(repository, git_reference_name(branch)),
          "git_repository_set_head");
    git_object_free(target);
    git_reference_free(branch);
    git_repository_free(repository);
}

static git_annotated_commit *lookupTheirs(git_repository *repository, const char *name)
{
    git_object *object = NULL;
    git_annotated_commit *theirs = NULL;
    check(git_revparse_single(&object, repository, name), "git_revparse_single");
    check(git_annotated_commit_lookup(&theirs, repository, git_object_id(object)),
          "git_annotated_commit_lookup");
    git_object_free(object);
    return theirs;
}

static void mergeTrees(git_repository *repository, const git_annotated_commit *theirs)
{
    size_t calls = 0;
    git_merge_analysis_t analysis;
    git_merge_preference_t preference;
    git_merge_options mergeOptions;
    git_index *index = NULL;
    if (git_repository_state(repository) != GIT_REPOSITORY_STATE_NONE)
    {
        fail("git_repository_state");
    }
    check(git_merge_analysis(&analysis, &preference, repository, &theirs, 1), "git_merge_analysis");
    git_merge_options_init(&mergeOptions, GIT_MERGE_OPTIONS_VERSION);
    const git_checkout_options options =
        makeCheckoutOptions(GIT_CHECKOUT_FORCE | GIT_CHECKOUT_ALLOW_CONFLICTS, &calls);
    check(git_merge(repository, &theirs, 1, &mergeOptions, &options), "git_merge");
    check(git_repository_index(&index, repository), "git_repository_index");
    if (git_index_has_conflicts(index))
    {
        fail("git_index_has_conflicts");
    }
    git_index_free(index);
}

static int appendMergeHead(const git_oid *id, void *payload)
{
    *(git_oid *)payload = *id;
    return 0;
}

/// What the library's commit does at the end of a merge, for which it opens the repository again.
static void commitMerge(const char *root, const char *name)
{
    git_repository *const repository = openRepository(root);
    git_reference *reference = NULL;
    git_commit *parents[2];
    git_oid mergeHead;
    check(git_reference_dwim(&reference, repository, name), "git_reference_dwim");
    git_reference_free(reference);
    parents[0] = lookupHead(repository);
    check(git_repository_mergehead_foreach(repository, appendMergeHead, &mergeHead),
          "git_repository_mergehead_foreach");
    check(git_commit_lookup(&parents[1], repository, &mergeHead), "git_commit_lookup");
    commitIndex(repository, 2, (const git_commit **)parents);
    git_commit_free(parents[1]);
    git_commit_free(parents[0]);
    git_repository_free(repository);
}

static void merge(const char *root, const char *name)
{
    git_repository *const repository = openRepository(root);
    git_annotated_commit *const theirs = lookupTheirs(repository, name);
    mergeTrees(repository, theirs);
    git_annotated_commit_free(theirs);
    git_repository_free(repository);
    commitMerge(root, name);
}

static void measure(const char *operation, const char *root, const char *name)
{
    size_t count = 0;
    registerFloorDriver();
    beginRegion();
    if (strcmp(operation, "branches") == 0)
    {
        count = listBranches(root);
    }
    else if (strcmp(operation, "delete") == 0)
    {
        count = deleteBranches(root, name);
    }
    else if (strcmp(operation, "revisions") == 0)
    {
        count = readRevisions(root, name);
    }
    else if (strcmp(operation, "switch") == 0)
    {
        switchBranch(root, name);
    }
    else
    {
        merge(root, name);
    }
    endRegion();
    printRegion(count);
}

static void measureChild(const char *operation, const char *root, const char *name)
{
    setenv("BENCH_ROOT", root, 1);
    setenv("BENCH_NAME", name, 1);
    if (strcmp(operation, "branches") == 0)
    {
        measureShell("exec git -C \"$BENCH_ROOT\" for-each-ref refs/heads");
    }
    else if (strcmp(operation, "delete") == 0)
    {
        measureShell("git -C \"$BENCH_ROOT\" for-each-ref --count=\"$BENCH_NAME\" "
                     "--format='%(refname:short)' refs/heads/topic-* "
                     "| xargs git -C \"$BENCH_ROOT\" branch --quiet -D");
    }
    else if (strcmp(operation, "revisions") == 0)
    {
        measureShell("exec git -C \"$BENCH_ROOT\" for-each-ref --count=\"$BENCH_NAME\" "
                     "refs/heads/topic-*");
    }
    else if (strcmp(operation, "switch") == 0)
    {
        measureShell("exec git -C \"$BENCH_ROOT\" switch --quiet \"$BENCH_NAME\"");
    }
    else
    {
        measureShell("exec git -C \"$BENCH_ROOT\" merge --quiet --no-edit \"$BENCH_NAME\"");
    }
}

/// A fork costs what the process has mapped: for a fair comparison as much as the other program.
static void loadLibrary(void)
{
    const char *const library = getenv("BENCH_LOAD");
    if (library != NULL && dlopen(library, RTLD_NOW) == NULL)
    {
        fail(dlerror());
    }
}

int main(int argc, char **argv)
{
    loadLibrary();
    return runFloor(argc, argv,
                    "branch_floor [child] branches|delete|revisions|switch|merge|driver ROOT "
                    "NAME|COUNT",
                    measure, measureChild);
}
