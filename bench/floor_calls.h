// SPDX-License-Identifier: MIT
#pragma once

#include <stddef.h>

#include <git2.h>

/// What the programs of the floor have in common. A failure ends the program.

_Noreturn void fail(const char *what);
void check(int code, const char *what);

git_repository *openRepository(const char *root);

/// A status walk as the library asks for it, its repository opened and released.
/// @return how many files it gave
size_t walk(const char *root, git_strarray pathspec);

/// Reads one name a line; the names hold nothing that a pattern would have to escape.
git_strarray readNames(const char *listFile);

/// The commit that HEAD names, for the caller to free.
git_commit *lookupHead(git_repository *repository);

/// Commits all tracked files as they stand.
void commitIndex(git_repository *repository, size_t parentCount, const git_commit **parents);

/// Wires callbacks into a checkout that count their calls.
void countCheckout(git_checkout_options *options, size_t *calls);

/// Measures what a host without a library would do: a child process, its output read to the end.
void measureShell(const char *command);
