// SPDX-License-Identifier: MIT
#define _GNU_SOURCE
#include "bench/floor_driver.h"

#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include <fcntl.h>
#include <git2.h>
#include <git2/sys/merge.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include "bench/floor_calls.h"

#define NAME_SIZE 32

static void writeSide(char *name, const git_index_entry *entry, git_repository *repository)
{
    git_odb *database = NULL;
    git_odb_object *blob = NULL;
    strcpy(name, "/tmp/side.XXXXXX");
    const int file = mkostemp(name, O_CLOEXEC);
    check(git_repository_odb(&database, repository), "git_repository_odb");
    check(git_odb_read(&blob, database, &entry->id), "git_odb_read");
    const size_t size = git_odb_object_size(blob);
    if (file < 0 || write(file, git_odb_object_data(blob), size) != (ssize_t)size)
    {
        fail(name);
    }
    close(file);
    git_odb_object_free(blob);
    git_odb_free(database);
}

static int runTool(char files[3][NAME_SIZE])
{
    int status = -1;
    const char *const tool = getenv("BENCH_TOOL");
    const pid_t child = fork();
    if (child == 0)
    {
        if (tool != NULL)
        {
            execl(tool, tool, files[0], files[1], files[2], files[1], (char *)NULL);
        }
        else
        {
            execlp("cp", "cp", files[2], files[1], (char *)NULL);
        }
        _exit(127);
    }
    return waitpid(child, &status, 0) == child && status == 0 ? 0 : -1;
}

static void readBack(git_buf *merged, const char *name)
{
    struct stat status;
    const int file = open(name, O_RDONLY | O_CLOEXEC);
    if (file < 0 || fstat(file, &status) != 0)
    {
        fail(name);
    }
    char *const bytes = malloc((size_t)status.st_size + 1);
    const ssize_t size = read(file, bytes, (size_t)status.st_size);
    close(file);
    check(git_buf_set(merged, bytes, (size_t)size), "git_buf_set");
    free(bytes);
}

static int apply(git_merge_driver *self, const char **path, uint32_t *mode, git_buf *merged,
                 const char *name, const git_merge_driver_source *source)
{
    char files[3][NAME_SIZE];
    const git_index_entry *const sides[] = {git_merge_driver_source_ancestor(source),
                                            git_merge_driver_source_ours(source),
                                            git_merge_driver_source_theirs(source)};
    git_repository *const repository = git_merge_driver_source_repo(source);
    (void)self;
    (void)name;
    for (int i = 0; i < 3; ++i)
    {
        writeSide(files[i], sides[i], repository);
    }
    check(runTool(files), "the merge tool");
    readBack(merged, files[1]);
    for (int i = 0; i < 3; ++i)
    {
        unlink(files[i]);
    }
    *path = sides[1]->path;
    *mode = sides[1]->mode;
    return 0;
}

void registerFloorDriver(void)
{
    static git_merge_driver driver = {GIT_MERGE_DRIVER_VERSION, NULL, NULL, apply};
    git_merge_driver_register("*", &driver);
}
