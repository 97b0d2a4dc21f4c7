// SPDX-License-Identifier: MIT
// Clones and the operations with a remote, called as a host calls them. The counterpart of
// remote_floor.c.
#include <cstdio>
#include <exception>
#include <string>

#include "bench/host.hpp"
#include "bench/region.h"
#include "fl/i18n/convert.hpp"
#include "vclink/git/GitRemote.hpp"

namespace
{

using namespace vclink::bench;
using vclink::git::GitRemote;

std::size_t carryOut(GitRemote &remote, const std::string &operation)
{
    if (operation == "heads")
    {
        return remote.getRemoteHeads().size();
    }
    if (operation == "fetch")
    {
        remote.fetch({});
    }
    else
    {
        remote.push({u"refs/heads/main"});
    }
    return 0;
}

void measureClone(const std::string &root, const std::string &url)
{
    const auto generator = makeGenerator();
    const ustring specifier = fl::i18n::utf8_to_ustring(url);
    const upath folder = toPath(root);
    beginRegion();
    generator->generate(specifier, folder);
    endRegion();
    printRegion(0);
}

void measure(const std::string &operation, const std::string &root)
{
    const auto adapter = makeAdapter(toPath(root));
    const auto remote = GitRemote::create("origin", *adapter);
    beginRegion();
    const std::size_t count = carryOut(*remote, operation);
    endRegion();
    printRegion(count);
}

} // namespace

int main(int argc, char **argv)
{
    if (argc != 4)
    {
        std::fputs("usage: remote_library clone|fetch|push|heads ROOT URL\n", stderr);
        return 2;
    }
    try
    {
        if (std::string(argv[1]) == "clone")
        {
            measureClone(argv[2], argv[3]);
        }
        else
        {
            measure(argv[1], argv[2]);
        }
        return 0;
    }
    catch (const std::exception &failure)
    {
        std::fprintf(stderr, "remote_library: %s\n", failure.what());
        return 1;
    }
}
