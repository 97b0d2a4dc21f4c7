// SPDX-License-Identifier: MIT
#pragma once

// git_error_set_str and git_error_clear, which have a header of their own from libgit2 1.8 on.
#include <git2/errors.h>
#if __has_include(<git2/sys/errors.h>)
#include <git2/sys/errors.h>
#endif
