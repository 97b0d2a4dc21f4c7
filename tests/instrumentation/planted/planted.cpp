// SPDX-License-Identifier: MIT
#include "instrumentation/planted/planted.hpp"

namespace vclink::planted
{

int useAll(int number)
{
    const char byte = 'a';
    countUp(number);
    return successor(number) + byteAt(&byte, 0) + (isOptimised() ? 1 : 0);
}

} // namespace vclink::planted
