// SPDX-License-Identifier: MIT
// Faults that scripts/fuzz expects to see reported before it relies on the sanitizers. Input: the
// name of one.
#include <limits>
#include <memory>

#include "check.hpp"
#include "instrumentation/planted/planted.hpp"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size)
{
    const std::string fault = vclink::fuzz::bytesOf(data, size);
    if (fault == "overflow")
        return vclink::planted::successor(std::numeric_limits<int>::max()) == 0 ? 0 : -1;
    if (fault == "beyond the end")
    {
        const auto byte = std::make_unique<char>('a');
        return vclink::planted::byteAt(byte.get(), 1) == 'a' ? 0 : -1;
    }
    return 0;
}
