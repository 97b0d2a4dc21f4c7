// SPDX-License-Identifier: MIT
#define _GNU_SOURCE
#include "bench/floor_calls.h"

#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include <sys/resource.h>

#include "bench/region.h"

void fail(const char *what)
{
    const git_error *const error = git_error_last();
    fprintf(stderr, "floor: %s: %s\n", what, error != NULL ? error->message : "no text");
    exit(1);
}

void check(int code, const char *what)
{
    if (code != 0)
    {
        fail(what);
    }
}

git_repository *openRepository(const char *root)
{
    git_repository *repository = NULL;
    check(git_repository_open_ext(&repository, root, GIT_REPOSITORY_OPEN_NO_SEARCH, NULL), root);
    return repository;
}

static int countStatus(const char *path, unsigned int flags, void *payload)
{
    (void)path;
    (void)flags;
    ++*(size_t *)payload;
    return 0;
}

size_t walk(const char *root, git_strarray pathspec)
{
    size_t count = 0;
    git_repository *const repository = openRepository(root);
    git_status_options options;
    git_status_options_init(&options, GIT_STATUS_OPTIONS_VERSION);
    options.show = GIT_STATUS_SHOW_INDEX_AND_WORKDIR;
    options.flags = GIT_STATUS_OPT_INCLUDE_UNTRACKED | GIT_STATUS_OPT_INCLUDE_UNMODIFIED |
                    GIT_STATUS_OPT_RECURSE_UNTRACKED_DIRS | GIT_STATUS_OPT_RENAMES_HEAD_TO_INDEX;
    options.pathspec = pathspec;
    check(git_status_foreach_ext(repository, &options, countStatus, &count),
          "git_status_foreach_ext");
    git_repository_free(repository);
    return count;
}

git_strarray readNames(const char *listFile)
{
    FILE *const file = fopen(listFile, "r");
    if (file == NULL)
    {
        perror(listFile);
        exit(1);
    }
    git_strarray names = {NULL, 0};
    char *line = NULL;
    size_t capacity = 0;
    while (getline(&line, &capacity, file) > 0)
    {
        line[strcspn(line, "\n")] = '\0';
        names.strings = realloc(names.strings, (names.count + 1) * sizeof(char *));
        names.strings[names.count++] = line;
        line = NULL;
        capacity = 0;
    }
    fclose(file);
    return names;
}

git_commit *lookupHead(git_repository *repository)
{
    git_reference *reference = NULL;
    git_commit *commit = NULL;
    check(git_reference_dwim(&reference, repository, "HEAD"), "git_reference_dwim");
    check(git_commit_lookup(&commit, repository, git_reference_target(reference)),
          "git_commit_lookup");
    git_reference_free(reference);
    return commit;
}

void commitIndex(git_repository *repository, size_t parentCount, const git_commit **parents)
{
    git_signature *signature = NULL;
    git_index *index = NULL;
    git_tree *tree = NULL;
    git_oid id;
    check(git_signature_default(&signature, repository), "git_signature_default");
    check(git_repository_index(&index, repository), "git_repository_index");
    check(git_index_update_all(index, NULL, NULL, NULL), "git_index_update_all");
    check(git_index_write(index), "git_index_write");
    check(git_index_write_tree(&id, index), "git_index_write_tree");
    check(git_tree_lookup(&tree, repository, &id), "git_tree_lookup");
    check(git_commit_create(&id, repository, "HEAD", signature, signature, "UTF-8", "Change", tree,
                            parentCount, parents),
          "git_commit_create");
    check(git_repository_state_cleanup(repository), "git_repository_state_cleanup");
    git_tree_free(tree);
    git_index_free(index);
    git_signature_free(signature);
}

static int countNotification(git_checkout_notify_t why, const char *path,
                             const git_diff_file *baseline, const git_diff_file *target,
                             const git_diff_file *workdir, void *payload)
{
    (void)why;
    (void)path;
    (void)baseline;
    (void)target;
    (void)workdir;
    ++*(size_t *)payload;
    return 0;
}

static void countProgress(const char *path, size_t completed, size_t total, void *payload)
{
    (void)path;
    (void)completed;
    (void)total;
    ++*(size_t *)payload;
}

static void countPerfdata(const git_checkout_perfdata *data, void *payload)
{
    (void)data;
    ++*(size_t *)payload;
}

void countCheckout(git_checkout_options *options, size_t *calls)
{
    options->notify_flags = GIT_CHECKOUT_NOTIFY_ALL;
    options->notify_cb = countNotification;
    options->progress_cb = countProgress;
    options->perfdata_cb = countPerfdata;
    options->notify_payload = options->progress_payload = options->perfdata_payload = calls;
}

int runFloor(int argc, char **argv, const char *usage, Measurement *floor, Measurement *child)
{
    const int isChild = argc > 1 && strcmp(argv[1], "child") == 0;
    char **const arguments = argv + isChild;
    if (argc - isChild != 4)
    {
        fprintf(stderr, "usage: %s\n", usage);
        return 2;
    }
    git_libgit2_init();
    (isChild ? child : floor)(arguments[1], arguments[2], arguments[3]);
    git_libgit2_shutdown();
    return 0;
}

void measureShell(const char *command)
{
    size_t bytes = 0;
    char buffer[65536];
    beginRegion();
    FILE *const output = popen(command, "r");
    size_t got = 0;
    while (output != NULL && (got = fread(buffer, 1, sizeof buffer, output)) > 0)
    {
        bytes += got;
    }
    const int status = output == NULL ? -1 : pclose(output);
    endRegion();
    if (status != 0)
    {
        fail(command);
    }
    printRegion(bytes);
    struct rusage usage;
    getrusage(RUSAGE_CHILDREN, &usage);
    printf("child_peak_kib %ld\n", usage.ru_maxrss);
}
