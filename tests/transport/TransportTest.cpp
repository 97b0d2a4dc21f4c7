// SPDX-License-Identifier: MIT
#include "TransportTest.hpp"

namespace vclink::test
{

TransportTest::TransportTest()
{
    server().prepareClient();
    source_.git({"remote", "add", "origin", served_.path()});
}

void TransportTest::TearDownTestSuite()
{
    stopServers();
}

std::string TransportTest::change(const std::string &name, const std::string &bytes)
{
    source_.write(name, bytes);
    return source_.commitAll("change " + name);
}

void TransportTest::publish(const std::vector<std::string> &refspecs) const
{
    std::vector<std::string> arguments{"push", "--quiet", "origin"};
    arguments.insert(arguments.end(), refspecs.begin(), refspecs.end());
    source_.git(arguments);
}

GitRepository TransportTest::cloneWithGit(const std::string &name) const
{
    return GitRepository::clone(url_, folder() / name);
}

std::string TransportTest::servedId(const std::string &reference) const
{
    return served_.line({"for-each-ref", "--format=%(objectname)", reference});
}

} // namespace vclink::test
