// SPDX-License-Identifier: MIT
// The branch operations, called as a host calls them. The counterpart of branch_floor.c.
#include <cstdio>
#include <exception>
#include <string>

#include "bench/host.hpp"
#include "bench/region.h"
#include "vclink/git/BranchManager.hpp"

namespace
{

using namespace vclink::bench;
using vclink::git::BranchManager;

std::size_t carryOut(BranchManager &manager, const std::string &operation, const std::string &name)
{
    if (operation == "branches")
    {
        return manager.getLocalBranches().size();
    }
    if (operation == "switch")
    {
        manager.switchBranch(name);
    }
    else
    {
        manager.merge(name);
    }
    return 0;
}

void measure(const std::string &operation, const std::string &root, const std::string &name)
{
    const auto adapter = makeAdapter(toPath(root));
    const auto manager = BranchManager::create(*adapter);
    beginRegion();
    const std::size_t count = carryOut(*manager, operation, name);
    endRegion();
    printRegion(count);
}

} // namespace

int main(int argc, char **argv)
{
    if (argc != 4)
    {
        std::fputs("usage: branch_library branches|switch|merge|driver ROOT NAME\n", stderr);
        return 2;
    }
    try
    {
        measure(argv[1], argv[2], argv[3]);
        return 0;
    }
    catch (const std::exception &failure)
    {
        std::fprintf(stderr, "branch_library: %s\n", failure.what());
        return 1;
    }
}
