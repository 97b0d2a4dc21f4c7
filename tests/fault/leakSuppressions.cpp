// SPDX-License-Identifier: MIT

/// Asked for by the leak sanitizer, in place of what other programs answer. If reading a
/// configuration or an object fails, libgit2 does not release all that it has read. The tests count
/// the handles that the library holds.
extern "C" __attribute__((visibility("default"))) const char *
leakSuppressionsOfFaults() __asm__("__lsan_default_suppressions");

extern "C" const char *leakSuppressionsOfFaults()
{
    return "leak:libpcre2-8\n"
           "leak:libssh2\n"
           "leak:libgit2\n";
}
