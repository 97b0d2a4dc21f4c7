// SPDX-License-Identifier: MIT
#include "DaemonFixture.hpp"

#include <random>

namespace vclink::test
{

DaemonFixture::DaemonFixture()
{
    commit_ = commitNoise(source_, 1);
    source_.git({"branch", "other", commit_});
    source_.git({"push", "--quiet", served_.path(), "--all"});
}

std::string DaemonFixture::urlAt(std::uint16_t port) const
{
    return "git://127.0.0.1:" + std::to_string(port) + "/" + served_.path().filename().string();
}

std::string DaemonFixture::commitNoise(GitRepository &repository, unsigned seed, std::size_t bytes)
{
    std::mt19937 engine(seed);
    for (int i = 0; i < fileCount; ++i)
    {
        std::string noise(bytes / fileCount, '\0');
        for (char &byte : noise)
            byte = static_cast<char>(engine() & 0xFF);
        repository.write("folder" + std::to_string(i % 7) + "/file" + std::to_string(i), noise);
    }
    return repository.commitAll("noise");
}

std::string DaemonFixture::servedId(const std::string &reference) const
{
    return served_.line({"for-each-ref", "--format=%(objectname)", reference});
}

} // namespace vclink::test
