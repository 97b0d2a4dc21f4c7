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

std::string nameOf(std::size_t number)
{
    const std::string digits = std::to_string(number);
    return "topic-" + std::string(5 - digits.size(), '0') + digits;
}

std::size_t deleteBranches(BranchManager &manager, std::size_t count)
{
    for (std::size_t number = 0; number < count; ++number)
    {
        manager.deleteBranch(nameOf(number));
    }
    return count;
}

std::size_t readRevisions(const BranchManager &manager, std::size_t count)
{
    std::size_t bytes = 0;
    for (std::size_t number = 0; number < count; ++number)
    {
        bytes += manager.getRevision(nameOf(number)).size();
    }
    return bytes == 0 ? 0 : count;
}

std::size_t carryOut(BranchManager &manager, const std::string &operation, const std::string &name)
{
    if (operation == "branches")
    {
        return manager.getLocalBranches().size();
    }
    if (operation == "delete")
    {
        return deleteBranches(manager, std::stoul(name));
    }
    if (operation == "revisions")
    {
        return readRevisions(manager, std::stoul(name));
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
        std::fputs("usage: branch_library branches|delete|revisions|switch|merge|driver ROOT "
                   "NAME|COUNT\n",
                   stderr);
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
