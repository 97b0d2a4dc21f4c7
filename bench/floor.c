// SPDX-License-Identifier: MIT
// The floor: what the calls to libgit2 cost by themselves. Counts, and keeps nothing.
#define _GNU_SOURCE
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include <git2.h>

#include "bench/floor_calls.h"
#include "bench/region.h"

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

static void measureProbe(const char *folder)
{
    beginRegion();
    const int code = git_repository_open_ext(NULL, folder, GIT_REPOSITORY_OPEN_NO_SEARCH, NULL);
    endRegion();
    printRegion(code == 0);
}

static void measureChild(const char *root)
{
    setenv("BENCH_ROOT", root, 1);
    setenv("GIT_OPTIONAL_LOCKS", "0", 1);
    measureShell("exec git -C \"$BENCH_ROOT\" status --porcelain -uall");
}

static void measureChildOfFiles(const char *root, const char *list)
{
    setenv("BENCH_ROOT", root, 1);
    setenv("BENCH_LIST", list, 1);
    setenv("GIT_OPTIONAL_LOCKS", "0", 1);
    measureShell("exec xargs --arg-file=\"$BENCH_LIST\" git -C \"$BENCH_ROOT\" status "
                 "--porcelain -uall --");
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
    else if (argc == 4 && strcmp(argv[1], "child") == 0)
    {
        measureChildOfFiles(argv[2], argv[3]);
    }
    else
    {
        fputs("usage: floor folder ROOT | files ROOT LIST | probe FOLDER | child ROOT [LIST]\n",
              stderr);
        return 2;
    }
    git_libgit2_shutdown();
    return 0;
}
