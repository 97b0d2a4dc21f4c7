// SPDX-License-Identifier: MIT
#include <cstdio>
#include <cstdlib>
#include <exception>

#include "Worker.hpp"
#include "vclink/git/LibGit2Guard.hpp"

/// WORKPLACE SEED FIRST NEXT: tidies up, performs FIRST, and then NEXT until the process is killed.
int main(int count, char **arguments)
{
    if (count != 5)
        return EXIT_FAILURE;
    try
    {
        const vclink::git::LibGit2Guard guard;
        vclink::test::Worker worker(arguments[1], std::strtoull(arguments[2], nullptr, 10));
        worker.tidy();
        worker.perform(arguments[3]);
        for (;;)
            worker.perform(arguments[4]);
    }
    catch (const std::exception &exception)
    {
        std::fprintf(stderr, "%s\n", exception.what());
    }
    return EXIT_FAILURE;
}
