// SPDX-License-Identifier: MIT
// The library, called as a host calls it. The counterpart of floor.c.
#include <cstdio>
#include <exception>
#include <optional>
#include <string>
#include <vector>

#include "bench/host.hpp"
#include "bench/region.h"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/LibGit2Guard.hpp"

namespace
{

using namespace vclink::bench;

void measureFolder(const upath &root)
{
    const auto adapter = makeAdapter(root);
    beginRegion();
    const vclink::FileStateMap states = adapter->getFolderStates(root);
    endRegion();
    printRegion(states.size());
}

void measureFiles(const upath &root, const std::vector<upath> &files)
{
    const auto adapter = makeAdapter(root);
    beginRegion();
    const vclink::FileStateMap states = adapter->getFileStates(files);
    endRegion();
    printRegion(states.size());
}

void measureProbe(const upath &folder, bool holdGuard)
{
    std::optional<vclink::git::LibGit2Guard> guard;
    if (holdGuard)
    {
        guard.emplace();
    }
    const vclink::git::GitAdapterFactory factory;
    beginRegion();
    const bool served = factory.isAdapterFor(folder);
    endRegion();
    printRegion(served ? 1 : 0);
}

/// Compares neighbours, as an insertion at the end of a map does. The entries are the comparisons.
void measureLess(const std::vector<upath> &paths)
{
    // NOLINTNEXTLINE(modernize-use-transparent-functors): less<> compares with operator<
    const std::less<upath> less;
    std::size_t comparisons = 0;
    std::size_t ascending = 0;
    beginRegion();
    for (std::size_t i = 1; i < paths.size(); ++i)
    {
        ascending += less(paths[i - 1], paths[i]) ? 1 : 0;
        ++comparisons;
    }
    endRegion();
    printRegion(comparisons);
    std::printf("ascending %zu\n", ascending);
}

int run(int argc, char **argv)
{
    const std::string mode = argc > 2 ? argv[1] : "";
    if (mode == "folder" && argc == 3)
    {
        measureFolder(toPath(argv[2]));
    }
    else if (mode == "files" && argc == 4)
    {
        measureFiles(toPath(argv[2]), readPaths(argv[2], argv[3]));
    }
    else if (mode == "less" && argc == 4)
    {
        measureLess(readPaths(argv[2], argv[3]));
    }
    else if ((mode == "probe" || mode == "probe-alone") && argc == 3)
    {
        measureProbe(toPath(argv[2]), mode == "probe");
    }
    else
    {
        std::fputs("usage: library folder ROOT | files ROOT LIST | less ROOT LIST | probe FOLDER | "
                   "probe-alone FOLDER\n",
                   stderr);
        return 2;
    }
    return 0;
}

} // namespace

int main(int argc, char **argv)
{
    try
    {
        return run(argc, argv);
    }
    catch (const std::exception &failure)
    {
        std::fprintf(stderr, "library: %s\n", failure.what());
        return 1;
    }
}
