// SPDX-License-Identifier: MIT
#include "support/Scripts.hpp"

#include <cerrno>
#include <fstream>
#include <stdexcept>
#include <system_error>
#include <utility>

#include <sys/stat.h>

namespace vclink::test
{

Scripts::Scripts(std::filesystem::path folder) : folder_(std::move(folder))
{
    std::filesystem::create_directories(folder_);
}

std::string Scripts::shell(const std::string &body)
{
    return file("#!/bin/sh\n" + body + '\n', 0755);
}

std::string Scripts::file(const std::string &bytes, unsigned mode)
{
    const std::string path = newPath();
    std::ofstream stream(path, std::ios::binary);
    stream << bytes << std::flush;
    if (!stream)
        throw std::runtime_error("can't write " + path);
    stream.close();
    std::filesystem::permissions(path, std::filesystem::perms(mode));
    return path;
}

std::string Scripts::pipe()
{
    std::string path = newPath();
    if (::mkfifo(path.c_str(), 0666) != 0)
        throw std::system_error(errno, std::generic_category(), "mkfifo");
    return path;
}

std::string Scripts::newPath()
{
    return folder_ / std::to_string(++count_);
}

} // namespace vclink::test
