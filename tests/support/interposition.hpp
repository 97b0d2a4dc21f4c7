// SPDX-License-Identifier: MIT
#pragma once

#include <cstdarg>
#include <cstdlib>

#include <dlfcn.h>
#include <fcntl.h>
#include <sys/types.h>

/// What a program's own definitions of others' functions are made of, which go before theirs.
namespace vclink::test
{

/// The definition that comes next: the library's own, or a sanitizer's in its place.
template <class Function> Function *findNext(const char *name) noexcept
{
    void *const symbol = ::dlsym(RTLD_NEXT, name);
    if (symbol == nullptr)
        std::abort();
    return reinterpret_cast<Function *>(symbol);
}

/// The mode that open(2) is given with these flags, as the first of the further arguments.
inline mode_t readMode(int flags, va_list arguments)
{
    const bool hasMode = (flags & O_CREAT) != 0 || (flags & O_TMPFILE) == O_TMPFILE;
    return hasMode ? va_arg(arguments, mode_t) : 0;
}

} // namespace vclink::test
