// SPDX-License-Identifier: MIT
#include "instrumentation/planted/planted.hpp"

namespace vclink::planted
{

int useAll(int number)
{
    const char byte = 'a';
    countUp(number);
    // The compiler could keep only the result of a call.
    bool (*const volatile asked)() noexcept = isOptimised;
    return successor(number) + byteAt(&byte, 0) + (asked() ? 1 : 0);
}

} // namespace vclink::planted
