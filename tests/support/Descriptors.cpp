// SPDX-License-Identifier: MIT
#include "support/Descriptors.hpp"

#include <filesystem>
#include <system_error>

#include <gtest/gtest.h>

namespace vclink::test
{

std::map<int, std::string> openDescriptors()
{
    namespace fs = std::filesystem;
    std::map<int, std::string> descriptors;
    for (const auto &entry : fs::directory_iterator("/proc/self/fd"))
    {
        std::error_code gone;
        const auto target = fs::read_symlink(entry.path(), gone);
        if (!gone)
            descriptors.emplace(std::stoi(entry.path().filename()), target.string());
    }
    // What the listing itself had open is closed by now.
    for (auto entry = descriptors.begin(); entry != descriptors.end();)
    {
        const auto link = fs::path("/proc/self/fd") / std::to_string(entry->first);
        const bool open = fs::is_symlink(fs::symlink_status(link));
        entry = open ? std::next(entry) : descriptors.erase(entry);
    }
    return descriptors;
}

NoDescriptorLeak::NoDescriptorLeak() : before_(openDescriptors())
{
}

NoDescriptorLeak::~NoDescriptorLeak()
{
    EXPECT_EQ(openDescriptors(), before_) << "the process's descriptors have changed";
}

} // namespace vclink::test
