// SPDX-License-Identifier: MIT
#include "util/scope/wholeFile.hpp"

#include <array>
#include <cerrno>
#include <cstddef>

#include <fcntl.h>
#include <unistd.h>

#include "util/scope/FileDescriptor.hpp"

namespace vclink::git
{

int readWholeFile(const std::string &path, std::string &content)
{
    content.clear();
    const FileDescriptor file(::open(path.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC));
    if (!file)
    {
        return errno;
    }
    std::array<char, 4096> block;
    for (;;)
    {
        const ssize_t count = ::read(file.get(), block.data(), block.size());
        if (count == 0)
        {
            return 0;
        }
        if (count < 0 && errno != EINTR)
        {
            return errno;
        }
        content.append(block.data(), count < 0 ? 0 : static_cast<std::size_t>(count));
    }
}

} // namespace vclink::git
