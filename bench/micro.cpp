// SPDX-License-Identifier: MIT
#include <functional>
#include <string>

#include <benchmark/benchmark.h>

#include "error/logging/ScopeTrace.hpp"
#include "error/logging/logger.hpp"
#include "fl/filesystem/path.hpp"
#include "fl/i18n/convert.hpp"
#include "util/path/paths.hpp"

namespace
{

// NOLINTNEXTLINE(modernize-use-transparent-functors): it compares with operator<, not by elements
const std::less<upath> pathOrder;

constexpr const char *asciiName = "source/module-001/section-02/f-00123.cpp";
constexpr const char *otherName = "source/modül-001/section-02/файл-123.cpp";

void joinAsciiName(benchmark::State &state)
{
    const upath root(u"/home/user/project");
    for (auto _ : state)
    {
        benchmark::DoNotOptimize(vclink::git::joinRepositoryPath(root, asciiName));
    }
}
BENCHMARK(joinAsciiName);

void joinOtherName(benchmark::State &state)
{
    const upath root(u"/home/user/project");
    for (auto _ : state)
    {
        benchmark::DoNotOptimize(vclink::git::joinRepositoryPath(root, otherName));
    }
}
BENCHMARK(joinOtherName);

void compareNeighbours(benchmark::State &state)
{
    const upath left(u"/home/user/project/source/module-001/section-02/f-00123.cpp");
    const upath right(u"/home/user/project/source/module-001/section-02/f-00124.cpp");
    for (auto _ : state)
    {
        benchmark::DoNotOptimize(pathOrder(left, right));
    }
}
BENCHMARK(compareNeighbours);

void compareAcrossFolders(benchmark::State &state)
{
    const upath left(u"/home/user/project/source/module-001/section-02/f-00123.cpp");
    const upath right(u"/home/user/project/source/module-001-new/section-02/f-00123.cpp");
    for (auto _ : state)
    {
        benchmark::DoNotOptimize(pathOrder(left, right));
    }
}
BENCHMARK(compareAcrossFolders);

void convertAsciiText(benchmark::State &state)
{
    for (auto _ : state)
    {
        benchmark::DoNotOptimize(fl::i18n::utf8_to_ustring(asciiName));
    }
}
BENCHMARK(convertAsciiText);

void convertOtherText(benchmark::State &state)
{
    for (auto _ : state)
    {
        benchmark::DoNotOptimize(fl::i18n::utf8_to_ustring(otherName));
    }
}
BENCHMARK(convertOtherText);

void writeDisabledRecord(benchmark::State &state)
{
    for (auto _ : state)
    {
        vclink::git::writeRecord(vclink::git::SeverityDiagnostic, "name: ", asciiName);
        benchmark::ClobberMemory();
    }
}
BENCHMARK(writeDisabledRecord);

void openDisabledTrace(benchmark::State &state)
{
    for (auto _ : state)
    {
        const vclink::git::ScopeTrace trace(vclink::git::logger(), "signature", "bench/micro", 1);
        benchmark::ClobberMemory();
    }
}
BENCHMARK(openDisabledTrace);

} // namespace
