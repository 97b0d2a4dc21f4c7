// SPDX-License-Identifier: MIT
#include "libgit2Release.hpp"

/// Asked for by the leak sanitizer. libgit2 up to 1.5 does not release what it matches a regular
/// expression with when nothing matched, which is how it looks for submodules in a configuration.
/// Of each ssh connection it leaves the list of known hosts behind, and libssh2 1.10 what a server
/// says before it asks who is there. Weak, so that a program can answer otherwise.
extern "C" __attribute__((visibility("default"), weak)) const char *
leakSuppressions() __asm__("__lsan_default_suppressions");

extern "C" const char *leakSuppressions()
{
    return vclink::test::libgit2_release::losesMemory ? "leak:libpcre2-8\nleak:libssh2\n"
                                                      : "leak:libssh2\n";
}
