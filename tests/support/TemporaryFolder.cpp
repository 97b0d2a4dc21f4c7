// SPDX-License-Identifier: MIT
#include "support/TemporaryFolder.hpp"

#include <cerrno>
#include <cstdlib>
#include <iostream>
#include <system_error>

namespace vclink::test
{
namespace
{

std::filesystem::path makeFolder()
{
    namespace fs = std::filesystem;
    std::string name = fs::canonical(fs::temp_directory_path()) / "vclink-test-XXXXXX";
    if (::mkdtemp(name.data()) == nullptr)
        throw std::system_error(errno, std::generic_category(), "mkdtemp " + name);
    fs::permissions(name, fs::perms(0755));
    return name;
}

/// Gives the owner back what removal needs. Errors are left to the removal, which meets them again.
void makeRemovable(const std::filesystem::path &folder)
{
    namespace fs = std::filesystem;
    std::error_code ignored;
    fs::permissions(folder, fs::perms::owner_all, fs::perm_options::add, ignored);
    for (fs::directory_iterator entry(folder, ignored), end; entry != end; entry.increment(ignored))
    {
        if (fs::is_directory(entry->symlink_status(ignored)))
            makeRemovable(entry->path());
    }
}

} // namespace

TemporaryFolder::TemporaryFolder() : path_(makeFolder())
{
}

TemporaryFolder::~TemporaryFolder()
{
    makeRemovable(path_);
    std::error_code error;
    std::filesystem::remove_all(path_, error);
    if (error)
        std::cerr << "The temporary folder " << path_ << " stays: " << error.message() << '\n';
}

} // namespace vclink::test
