// SPDX-License-Identifier: MIT

/// Early releases of libgit2 do not release the two paths that it makes for each ssh connection
/// when it looks for the file of known hosts. The functions of libssh2 that it calls right before
/// and right after are here, in the program, where they are found first: allocations in between do
/// not count. A suppression would have to name libgit2 as a whole, which hides what the library
/// forgets.
#include "support/interposition.hpp"
#include "support/libgit2Release.hpp"

// There are none without the leak sanitizer.
extern "C" __attribute__((weak)) void disableLeakCheck() __asm__("__lsan_disable");
extern "C" __attribute__((weak)) void enableLeakCheck() __asm__("__lsan_enable");

extern "C" __attribute__((visibility("default"))) void *
makeSession(void *allocate, void *release, void *reallocate,
            void *abstract) __asm__("libssh2_session_init_ex");
extern "C" __attribute__((visibility("default"))) void *
makeKnownHosts(void *session) __asm__("libssh2_knownhost_init");

namespace
{

thread_local bool isDisabled = false;

void disable()
{
    if (disableLeakCheck != nullptr && !isDisabled)
    {
        isDisabled = true;
        disableLeakCheck();
    }
}

void enable()
{
    if (enableLeakCheck != nullptr && isDisabled)
    {
        isDisabled = false;
        enableLeakCheck();
    }
}

} // namespace

extern "C" void *makeSession(void *allocate, void *release, void *reallocate, void *abstract)
{
    void *const session = vclink::test::findNext<void *(void *, void *, void *, void *)>(
        "libssh2_session_init_ex")(allocate, release, reallocate, abstract);
    if (session != nullptr && vclink::test::libgit2_release::losesKnownHosts)
        disable();
    return session;
}

extern "C" void *makeKnownHosts(void *session)
{
    enable();
    return vclink::test::findNext<void *(void *)>("libssh2_knownhost_init")(session);
}
