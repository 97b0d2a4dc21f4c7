// SPDX-License-Identifier: MIT
#pragma once

extern "C" __attribute__((weak)) void disableLeakChecks() __asm__("__lsan_disable");
extern "C" __attribute__((weak)) void enableLeakChecks() __asm__("__lsan_enable");

namespace vclink::test
{

/// While it lives, memory that this thread allocates may be lost: libgit2 loses some after a
/// failure. Does nothing without the leak sanitizer.
class WithoutLeakChecks
{
  public:
    WithoutLeakChecks()
    {
        if (disableLeakChecks != nullptr)
            disableLeakChecks();
    }
    WithoutLeakChecks(const WithoutLeakChecks &) = delete;
    WithoutLeakChecks &operator=(const WithoutLeakChecks &) = delete;
    ~WithoutLeakChecks()
    {
        if (enableLeakChecks != nullptr)
            enableLeakChecks();
    }
};

} // namespace vclink::test
