// SPDX-License-Identifier: MIT

/// Asked for by the leak sanitizer. What libgit2 1.5 does not release when it meets what it can't
/// read. Each name is that of a call which gives its caller nothing to release, so that no leak of
/// this library hides behind it; but for git_reference_dwim, whose references the tests of faults
/// count.
extern "C" __attribute__((visibility("default"))) const char *
leakSuppressions() __asm__("__lsan_default_suppressions");

extern "C" const char *leakSuppressions()
{
    // A regular expression that nothing matched.
    return "leak:libpcre2-8\n"
           // The tree to check out, when the index can't be read.
           "leak:git_checkout_tree\n"
           // The prefixes of a difference, when the attributes can't be read.
           "leak:git_index_add_all\n"
           "leak:git_index_update_all\n"
           // The reference that a revision is named by, when its object is missing.
           "leak:git_reference_dwim\n"
           // A git:// connection that could not be made, and the list of a local remote's
           // references when one can't be read.
           "leak:git_remote_connect_ext\n"
           // A tree under way, when one below it can't be written: nothing of
           // git_index_write_tree's own is seen of it.
           "leak:vclink::git::writeIndexTree\n";
}
