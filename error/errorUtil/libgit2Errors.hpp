// SPDX-License-Identifier: MIT
#pragma once

// git_error_set_str and git_error_clear, which have their own header since libgit2 1.8.
#include <git2/errors.h>
#if __has_include(<git2/sys/errors.h>)
#include <git2/sys/errors.h>
#endif
