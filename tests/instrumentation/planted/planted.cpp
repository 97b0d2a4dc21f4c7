// SPDX-License-Identifier: MIT
#include "instrumentation/planted/planted.hpp"

namespace vclink::planted
{

int useAll(int number)
{
    const char byte = 'a';
    countUp(number);
    // Of a call the compiler could keep the result alone.
    bool (*const volatile asked)() noexcept = isOptimised;
    return successor(number) + byteAt(&byte, 0) + (asked() ? 1 : 0);
}

} // namespace vclink::planted
