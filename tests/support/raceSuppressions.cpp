// SPDX-License-Identifier: MIT

/// Asked for by the thread sanitizer. glibc guards the zone of the local time, which libgit2 asks
/// for at each signature, by a lock of its own that the sanitizer does not see. Boost.Log makes its
/// core once for all threads, in its own library, which is not instrumented.
extern "C" __attribute__((visibility("default"))) const char *
raceSuppressions() __asm__("__tsan_default_suppressions");

extern "C" const char *raceSuppressions()
{
    return "race:tzset_internal\nrace:boost::log::*::core::get\n";
}
