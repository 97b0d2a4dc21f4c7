// SPDX-License-Identifier: MIT
// What the log costs where nobody listens, for callgrind and for a look at the machine code.
#include <cstdio>
#include <string>

#include "bench/region.h"
#include "error/logging/ScopeTrace.hpp"
#include "error/logging/logger.hpp"

namespace vclink::git
{

[[gnu::noinline]] void writeNothing()
{
    asm volatile("");
}

[[gnu::noinline]] void writeDisabledRecord(int value)
{
    writeRecord(SeverityDiagnostic, "value: ", value);
}

[[gnu::noinline]] void openDisabledTrace()
{
    const ScopeTrace trace(logger(), __PRETTY_FUNCTION__, "bench/severity", 1);
    asm volatile("");
}

} // namespace vclink::git

namespace
{

constexpr int calls = 100000;

int usage()
{
    std::fputs("usage: severity nothing | record | trace\n", stderr);
    return 2;
}

template <class Function> int measure(Function function)
{
    vclink::git::logger();
    beginRegion();
    for (int i = 0; i < calls; ++i)
    {
        function(i);
    }
    endRegion();
    printRegion(calls);
    return 0;
}

} // namespace

int main(int argc, char **argv)
{
    const std::string mode = argc == 2 ? argv[1] : "";
    if (mode == "nothing")
    {
        return measure([](int) { vclink::git::writeNothing(); });
    }
    if (mode == "record")
    {
        return measure([](int i) { vclink::git::writeDisabledRecord(i); });
    }
    return mode == "trace" ? measure([](int) { vclink::git::openDisabledTrace(); }) : usage();
}
