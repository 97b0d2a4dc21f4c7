// SPDX-License-Identifier: MIT
// The operations that change the repository, called as a host calls them. The counterpart of
// change_floor.c.
#include <cstdio>
#include <exception>
#include <string>
#include <vector>

#include "bench/host.hpp"
#include "bench/region.h"

namespace
{

using namespace vclink::bench;

void change(vclink::CMAdapter &adapter, const std::string &operation,
            const std::vector<upath> &files)
{
    if (operation == "add")
    {
        adapter.addFiles(files);
    }
    else if (operation == "remove")
    {
        adapter.removeFiles(files);
    }
    else if (operation == "resolve")
    {
        adapter.markResolved(files.front());
    }
    else if (operation == "revert")
    {
        adapter.revertFiles(files);
    }
    else
    {
        adapter.commit(adapter.getRootFolder(), u"Change");
    }
}

void measure(const std::string &operation, const std::string &root, const char *listFile)
{
    const auto adapter = makeAdapter(toPath(root));
    const std::vector<upath> files = readPaths(root, listFile);
    beginRegion();
    change(*adapter, operation, files);
    endRegion();
    printRegion(files.size());
}

} // namespace

int main(int argc, char **argv)
{
    if (argc != 4)
    {
        std::fputs("usage: change_library add|remove|resolve|commit|revert ROOT LIST\n", stderr);
        return 2;
    }
    try
    {
        measure(argv[1], argv[2], argv[3]);
        return 0;
    }
    catch (const std::exception &failure)
    {
        std::fprintf(stderr, "change_library: %s\n", failure.what());
        return 1;
    }
}
