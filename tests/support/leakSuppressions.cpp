// SPDX-License-Identifier: MIT
#include "libgit2Release.hpp"

/// The leak sanitizer calls it. When libgit2 up to 1.5 looks for submodules in a configuration, it
/// does not release a regular expression that matched nothing. libssh2, up to 1.11 at least, does
/// not release what a server says before it asks for the user. Weak, so that a program can have its
/// own.
extern "C" __attribute__((visibility("default"), weak)) const char *
leakSuppressions() __asm__("__lsan_default_suppressions");

extern "C" const char *leakSuppressions()
{
    return vclink::test::libgit2_release::losesMemory ? "leak:libpcre2-8\nleak:libssh2\n"
                                                      : "leak:libssh2\n";
}
