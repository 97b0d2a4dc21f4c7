// SPDX-License-Identifier: MIT
// The floor of clones and of the operations with a remote: the same calls to libgit2, and nothing
// between them.
#define _GNU_SOURCE
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include <git2.h>

#include "bench/floor_calls.h"
#include "bench/region.h"

static int countText(const char *text, int length, void *payload)
{
    (void)text;
    (void)length;
    ++*(size_t *)payload;
    return 0;
}

static int countTransfer(const git_indexer_progress *stats, void *payload)
{
    (void)stats;
    ++*(size_t *)payload;
    return 0;
}

static int countTip(const char *name, const git_oid *before, const git_oid *after, void *payload)
{
    (void)name;
    (void)before;
    (void)after;
    ++*(size_t *)payload;
    return 0;
}

static int countPacking(int stage, uint32_t current, uint32_t total, void *payload)
{
    (void)stage;
    (void)current;
    (void)total;
    ++*(size_t *)payload;
    return 0;
}

static int countSending(unsigned current, unsigned total, size_t bytes, void *payload)
{
    (void)current;
    (void)total;
    (void)bytes;
    ++*(size_t *)payload;
    return 0;
}

static int countPushed(const char *name, const char *status, void *payload)
{
    ++*(size_t *)payload;
    if (status != NULL)
    {
        fail(name);
    }
    return 0;
}

static int countUpdates(const git_push_update **updates, size_t length, void *payload)
{
    (void)updates;
    *(size_t *)payload += length;
    return 0;
}

/// Wires callbacks that count their calls, as countCheckout() does.
static void countRemote(git_remote_callbacks *callbacks, size_t *calls)
{
    callbacks->sideband_progress = countText;
    callbacks->transfer_progress = countTransfer;
    callbacks->update_tips = countTip;
    callbacks->pack_progress = countPacking;
    callbacks->push_transfer_progress = countSending;
    callbacks->push_update_reference = countPushed;
    callbacks->push_negotiation = countUpdates;
    callbacks->payload = calls;
}

static git_remote *lookupRemote(git_repository *repository)
{
    git_remote *remote = NULL;
    check(git_remote_lookup(&remote, repository, "origin"), "git_remote_lookup");
    return remote;
}

static size_t cloneRepository(const char *root, const char *url)
{
    size_t calls = 0;
    git_repository *repository = NULL;
    git_clone_options options;
    git_clone_options_init(&options, GIT_CLONE_OPTIONS_VERSION);
    countCheckout(&options.checkout_opts, &calls);
    countRemote(&options.fetch_opts.callbacks, &calls);
    check(git_clone(&repository, url, root, &options), "git_clone");
    git_repository_free(repository);
    return calls;
}

static size_t fetch(git_remote *remote)
{
    size_t calls = 0;
    const git_strarray configured = {NULL, 0};
    git_fetch_options options;
    git_fetch_options_init(&options, GIT_FETCH_OPTIONS_VERSION);
    countRemote(&options.callbacks, &calls);
    check(git_remote_fetch(remote, &configured, &options, NULL), "git_remote_fetch");
    return calls;
}

static size_t push(git_remote *remote)
{
    size_t calls = 0;
    char *names[] = {"refs/heads/main"};
    const git_strarray refspecs = {names, 1};
    git_push_options options;
    git_push_options_init(&options, GIT_PUSH_OPTIONS_VERSION);
    countRemote(&options.callbacks, &calls);
    check(git_remote_push(remote, &refspecs, &options), "git_remote_push");
    return calls;
}

static size_t list(git_remote *remote)
{
    size_t calls = 0;
    size_t count = 0;
    const git_remote_head **heads = NULL;
    git_remote_callbacks callbacks;
    git_proxy_options proxy;
    git_remote_init_callbacks(&callbacks, GIT_REMOTE_CALLBACKS_VERSION);
    git_proxy_options_init(&proxy, GIT_PROXY_OPTIONS_VERSION);
    countRemote(&callbacks, &calls);
    check(git_remote_connect(remote, GIT_DIRECTION_FETCH, &callbacks, &proxy, NULL),
          "git_remote_connect");
    check(git_remote_ls(&heads, &count, remote), "git_remote_ls");
    return count;
}

static size_t carryOut(const char *operation, const char *root, const char *url)
{
    if (strcmp(operation, "clone") == 0)
    {
        return cloneRepository(root, url);
    }
    git_repository *const repository = openRepository(root);
    git_remote *const remote = lookupRemote(repository);
    const size_t count = strcmp(operation, "fetch") == 0  ? fetch(remote)
                         : strcmp(operation, "push") == 0 ? push(remote)
                                                          : list(remote);
    git_remote_free(remote);
    git_repository_free(repository);
    return count;
}

static void measure(const char *operation, const char *root, const char *url)
{
    beginRegion();
    const size_t count = carryOut(operation, root, url);
    endRegion();
    printRegion(count);
}

static void measureChild(const char *operation, const char *root, const char *url)
{
    setenv("BENCH_ROOT", root, 1);
    setenv("BENCH_URL", url, 1);
    if (strcmp(operation, "clone") == 0)
    {
        measureShell("exec git clone --quiet \"$BENCH_URL\" \"$BENCH_ROOT\"");
    }
    else if (strcmp(operation, "fetch") == 0)
    {
        measureShell("exec git -C \"$BENCH_ROOT\" fetch --quiet origin");
    }
    else if (strcmp(operation, "push") == 0)
    {
        measureShell("exec git -C \"$BENCH_ROOT\" push --quiet origin refs/heads/main");
    }
    else
    {
        measureShell("exec git -C \"$BENCH_ROOT\" ls-remote --quiet origin");
    }
}

int main(int argc, char **argv)
{
    return runFloor(argc, argv, "remote_floor [child] clone|fetch|push|heads ROOT URL", measure,
                    measureChild);
}
