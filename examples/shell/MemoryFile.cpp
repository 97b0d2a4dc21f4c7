// SPDX-License-Identifier: MIT
#include "MemoryFile.hpp"

#include <cerrno>

#include <sys/mman.h>
#include <unistd.h>

namespace vclink::shell
{

MemoryFile::MemoryFile(std::string_view bytes)
    : descriptor_(::memfd_create("vclink-shell", MFD_CLOEXEC))
{
    while (!bytes.empty() && descriptor_ >= 0)
    {
        const ssize_t written = ::write(descriptor_, bytes.data(), bytes.size());
        if (written < 0 && errno != EINTR)
        {
            return;
        }
        bytes.remove_prefix(written < 0 ? 0 : static_cast<std::size_t>(written));
    }
    isComplete_ = descriptor_ >= 0 && ::lseek(descriptor_, 0, SEEK_SET) == 0;
}

MemoryFile::~MemoryFile()
{
    if (descriptor_ >= 0)
    {
        ::close(descriptor_);
    }
}

int MemoryFile::descriptor() const noexcept
{
    return descriptor_;
}

bool MemoryFile::isComplete() const noexcept
{
    return isComplete_;
}

void MemoryFile::rewind() const noexcept
{
    ::lseek(descriptor_, 0, SEEK_SET);
}

std::string MemoryFile::read() const
{
    const off_t size = ::lseek(descriptor_, 0, SEEK_END);
    std::string bytes(size < 0 ? 0 : static_cast<std::size_t>(size), '\0');
    std::size_t done = 0;
    while (done < bytes.size())
    {
        const ssize_t count = ::pread(descriptor_, bytes.data() + done, bytes.size() - done,
                                      static_cast<off_t>(done));
        if (count <= 0)
        {
            break;
        }
        done += static_cast<std::size_t>(count);
    }
    bytes.resize(done);
    return bytes;
}

} // namespace vclink::shell
