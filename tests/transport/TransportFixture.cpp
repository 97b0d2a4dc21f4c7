// SPDX-License-Identifier: MIT
#include "TransportFixture.hpp"

namespace vclink::test
{

TransportFixture::TransportFixture()
{
    server().prepareClient();
    source_.git({"remote", "add", "origin", served_.path()});
}

void TransportFixture::TearDownTestSuite()
{
    stopServers();
}

std::string TransportFixture::change(const std::string &name, const std::string &bytes)
{
    source_.write(name, bytes);
    return source_.commitAll("change " + name);
}

void TransportFixture::publish(const std::vector<std::string> &refspecs) const
{
    std::vector<std::string> arguments{"push", "--quiet", "origin"};
    arguments.insert(arguments.end(), refspecs.begin(), refspecs.end());
    source_.git(arguments);
}

GitRepository TransportFixture::cloneWithGit(const std::string &name) const
{
    return GitRepository::clone(url_, folder() / name);
}

std::string TransportFixture::servedId(const std::string &reference) const
{
    return served_.line({"for-each-ref", "--format=%(objectname)", reference});
}

} // namespace vclink::test
