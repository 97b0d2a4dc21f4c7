// SPDX-License-Identifier: MIT
#include "fl/filesystem/native_name.hpp"

#include <cerrno>
#include <string>

#include <fcntl.h>
#include <unistd.h>

#include "fl/i18n/convert.hpp"

namespace fl::filesystem
{

int openNative(const ustring &name, int flags, mode_t mode)
{
    const std::string native = fl::i18n::ustring_to_utf8(name);
    if (native.find('\0') != std::string::npos)
    {
        errno = ENOENT;
        return -1;
    }
    int descriptor = -1;
    do
    {
        descriptor = ::open(native.c_str(), flags | O_CLOEXEC, mode);
    } while (descriptor < 0 && errno == EINTR);
    return descriptor;
}

DescriptorOwner::~DescriptorOwner()
{
    if (descriptor_ >= 0)
    {
        ::close(descriptor_);
    }
}

} // namespace fl::filesystem
