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

/// Measures an operation in a working copy; what `argument` is, each program says in its usage.
typedef void Measurement(const char *operation, const char *root, const char *argument);

/// What a program does with the line "[child] OPERATION ROOT ARGUMENT": measures by `floor`, or, of
/// a child process, by `child`, while libgit2 is alive.
/// @return the program's status
int runFloor(int argc, char **argv, const char *usage, Measurement *floor, Measurement *child);

/// Measures what a host without a library would do: a child process, its output read to the end.
void measureShell(const char *command);
