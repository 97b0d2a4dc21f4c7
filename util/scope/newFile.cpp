// SPDX-License-Identifier: MIT
#include "util/scope/newFile.hpp"

#include <cerrno>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace vclink::git
{

int writeAll(const FileDescriptor &file, const char *data, std::size_t size) noexcept
{
    while (size > 0)
    {
        const ssize_t written = ::write(file.get(), data, size);
        if (written < 0 && errno != EINTR)
        {
            return errno;
        }
        const std::size_t count = written < 0 ? 0 : static_cast<std::size_t>(written);
        data += count;
        size -= count;
    }
    return 0;
}

int createFile(const std::string &path, const std::string &text) noexcept
{
    const FileDescriptor file(
        ::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, DEFFILEMODE));
    if (!file)
    {
        // The file of another may exist, whatever the error is.
        return errno;
    }
    const int error = writeAll(file, text.data(), text.size());
    if (error != 0)
    {
        ::unlink(path.c_str());
    }
    return error;
}

} // namespace vclink::git
