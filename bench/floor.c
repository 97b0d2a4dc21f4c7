// SPDX-License-Identifier: MIT
// The floor: what the calls to libgit2 cost by themselves. Counts, and keeps nothing.
#define _GNU_SOURCE
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include <git2.h>

#include "bench/region.h"

static void fail(const char *what)
{
    const git_error *const error = git_error_last();
    fprintf(stderr, "floor: %s: %s\n", what, error != NULL ? error->message : "no text");
    exit(1);
}

static int countStatus(const char *path, unsigned int flags, void *payload)
{
    (void)path;
    (void)flags;
    ++*(size_t *)payload;
    return 0;
}

static size_t walk(const char *root, git_strarray pathspec)
{
    size_t count = 0;
    git_repository *repository = NULL;
    if (git_repository_open_ext(&repository, root, GIT_REPOSITORY_OPEN_NO_SEARCH, NULL) != 0)
    {
        fail(root);
    }
    git_status_options options;
    git_status_options_init(&options, GIT_STATUS_OPTIONS_VERSION);
    options.show = GIT_STATUS_SHOW_INDEX_AND_WORKDIR;
    options.flags = GIT_STATUS_OPT_INCLUDE_UNTRACKED | GIT_STATUS_OPT_INCLUDE_UNMODIFIED |
                    GIT_STATUS_OPT_RECURSE_UNTRACKED_DIRS | GIT_STATUS_OPT_RENAMES_HEAD_TO_INDEX;
    options.pathspec = pathspec;
    if (git_status_foreach_ext(repository, &options, countStatus, &count) != 0)
    {
        fail("git_status_foreach_ext");
    }
    git_repository_free(repository);
    return count;
}

static void measureWalk(const char *root, git_strarray pathspec)
{
    beginRegion();
    const size_t count = walk(root, pathspec);
    endRegion();
    printRegion(count);
}

static void measureFolder(const char *root)
{
    char everything[] = "*";
    char *patterns[] = {everything};
    measureWalk(root, (git_strarray){patterns, 1});
}

/// Reads one name a line; the names hold nothing that a pattern would have to escape.
static git_strarray readNames(const char *listFile)
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

static void measureProbe(const char *folder)
{
    beginRegion();
    const int code = git_repository_open_ext(NULL, folder, GIT_REPOSITORY_OPEN_NO_SEARCH, NULL);
    endRegion();
    printRegion(code == 0);
}

/// What a host without a library would do: a child process, its output read to the end.
static void measureChild(const char *root)
{
    size_t bytes = 0;
    char buffer[65536];
    setenv("BENCH_ROOT", root, 1);
    setenv("GIT_OPTIONAL_LOCKS", "0", 1);
    beginRegion();
    FILE *const output = popen("exec git -C \"$BENCH_ROOT\" status --porcelain -uall", "r");
    size_t got = 0;
    while (output != NULL && (got = fread(buffer, 1, sizeof buffer, output)) > 0)
    {
        bytes += got;
    }
    const int status = output == NULL ? -1 : pclose(output);
    endRegion();
    if (status != 0)
    {
        fail("git status");
    }
    printRegion(bytes);
}

int main(int argc, char **argv)
{
    git_libgit2_init();
    if (argc == 3 && strcmp(argv[1], "folder") == 0)
    {
        measureFolder(argv[2]);
    }
    else if (argc == 4 && strcmp(argv[1], "files") == 0)
    {
        measureWalk(argv[2], readNames(argv[3]));
    }
    else if (argc == 3 && strcmp(argv[1], "probe") == 0)
    {
        measureProbe(argv[2]);
    }
    else if (argc == 3 && strcmp(argv[1], "child") == 0)
    {
        measureChild(argv[2]);
    }
    else
    {
        fputs("usage: floor folder ROOT | files ROOT LIST | probe FOLDER | child ROOT\n", stderr);
        return 2;
    }
    git_libgit2_shutdown();
    return 0;
}
