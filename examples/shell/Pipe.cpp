// SPDX-License-Identifier: MIT
#include "Pipe.hpp"

#include <cerrno>
#include <system_error>

#include <fcntl.h>
#include <unistd.h>

namespace vclink::shell
{

Pipe::Pipe()
{
    int ends[2];
    if (::pipe2(ends, O_CLOEXEC) != 0)
    {
        throw std::system_error(errno, std::generic_category(), "A pipe can't be made");
    }
    readEnd_ = ends[0];
    writeEnd_ = ends[1];
    static_cast<void>(::fcntl(writeEnd_, F_SETFL, O_NONBLOCK));
}

Pipe::~Pipe()
{
    closeWriteEnd();
    ::close(readEnd_);
}

void Pipe::closeWriteEnd() noexcept
{
    if (writeEnd_ >= 0)
    {
        ::close(writeEnd_);
        writeEnd_ = -1;
    }
}

} // namespace vclink::shell
