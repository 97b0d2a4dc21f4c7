// SPDX-License-Identifier: MIT
#include "FailingFiles.hpp"

#include <cerrno>
#include <cstdarg>
#include <cstring>
#include <utility>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "support/interposition.hpp"

namespace
{

/// Plain variables: the functions below run before and after everything else.
bool isCounting = false;
int callsMade = 0;
int failingCall = 0;
int secondFailingCall = 0;
int failingError = 0;
const char *failedFunction = nullptr;
/// The file whose looks count, and nothing else; null when every call counts.
const char *lookedAt = nullptr;

bool countAndFail(const char *function) noexcept
{
    ++callsMade;
    if (callsMade != failingCall && callsMade != secondFailingCall)
        return false;
    failedFunction = function;
    errno = failingError;
    return true;
}

bool fails(const char *function) noexcept
{
    return isCounting && lookedAt == nullptr && countAndFail(function);
}

bool isLookAt(const char *path) noexcept
{
    return isCounting && lookedAt != nullptr && std::strcmp(path, lookedAt) == 0;
}

bool lookFails(const char *function, const char *path) noexcept
{
    return isLookAt(path) ? countAndFail(function) : fails(function);
}

} // namespace

namespace vclink::test
{

FailingFiles::FailingFiles() : FailingFiles(0, 0)
{
}

FailingFiles::FailingFiles(int call, int error) : FailingFiles(std::string(), call, call, error)
{
}

FailingFiles::FailingFiles(std::string file, int first, int second, int error)
    : file_(std::move(file))
{
    lookedAt = file_.empty() ? nullptr : file_.c_str();
    callsMade = 0;
    failingCall = first;
    secondFailingCall = second;
    failingError = error;
    failedFunction = nullptr;
    isCounting = true;
}

FailingFiles::~FailingFiles()
{
    isCounting = false;
}

int FailingFiles::calls() const noexcept
{
    return callsMade;
}

std::string FailingFiles::failed() const
{
    return failedFunction != nullptr ? failedFunction : "";
}

} // namespace vclink::test

using vclink::test::findNext;
using vclink::test::readMode;

extern "C"
{
#pragma GCC visibility push(default)

    int open(const char *path, int flags, ...)
    {
        va_list arguments;
        va_start(arguments, flags);
        const mode_t mode = readMode(flags, arguments);
        va_end(arguments);
        static auto *const real = findNext<int(const char *, int, ...)>("open");
        return fails("open") ? -1 : real(path, flags, mode);
    }

    int openat(int folder, const char *path, int flags, ...)
    {
        va_list arguments;
        va_start(arguments, flags);
        const mode_t mode = readMode(flags, arguments);
        va_end(arguments);
        static auto *const real = findNext<int(int, const char *, int, ...)>("openat");
        return fails("openat") ? -1 : real(folder, path, flags, mode);
    }

    int creat(const char *path, mode_t mode)
    {
        static auto *const real = findNext<int(const char *, mode_t)>("creat");
        return fails("creat") ? -1 : real(path, mode);
    }

    ssize_t read(int descriptor, void *data, size_t size)
    {
        static auto *const real = findNext<ssize_t(int, void *, size_t)>("read");
        return fails("read") ? -1 : real(descriptor, data, size);
    }

    ssize_t write(int descriptor, const void *data, size_t size)
    {
        static auto *const real = findNext<ssize_t(int, const void *, size_t)>("write");
        return fails("write") ? -1 : real(descriptor, data, size);
    }

    ssize_t pread(int descriptor, void *data, size_t size, off_t offset)
    {
        static auto *const real = findNext<ssize_t(int, void *, size_t, off_t)>("pread");
        return fails("pread") ? -1 : real(descriptor, data, size, offset);
    }

    ssize_t pwrite(int descriptor, const void *data, size_t size, off_t offset)
    {
        static auto *const real = findNext<ssize_t(int, const void *, size_t, off_t)>("pwrite");
        return fails("pwrite") ? -1 : real(descriptor, data, size, offset);
    }

    int rename(const char *from, const char *to) noexcept
    {
        static auto *const real = findNext<int(const char *, const char *)>("rename");
        return fails("rename") ? -1 : real(from, to);
    }

    int link(const char *from, const char *to) noexcept
    {
        static auto *const real = findNext<int(const char *, const char *)>("link");
        return fails("link") ? -1 : real(from, to);
    }

    int mkdir(const char *path, mode_t mode) noexcept
    {
        static auto *const real = findNext<int(const char *, mode_t)>("mkdir");
        return fails("mkdir") ? -1 : real(path, mode);
    }

    int close(int descriptor)
    {
        static auto *const real = findNext<int(int)>("close");
        const int result = real(descriptor);
        return fails("close") ? -1 : result;
    }

    int stat(const char *path, struct stat *status) noexcept
    {
        static auto *const real = findNext<int(const char *, struct stat *)>("stat");
        return lookFails("stat", path) ? -1 : real(path, status);
    }

    int lstat(const char *path, struct stat *status) noexcept
    {
        static auto *const real = findNext<int(const char *, struct stat *)>("lstat");
        return lookFails("lstat", path) ? -1 : real(path, status);
    }

    int access(const char *path, int mode) noexcept
    {
        static auto *const real = findNext<int(const char *, int)>("access");
        return isLookAt(path) && countAndFail("access") ? -1 : real(path, mode);
    }

    int fstat(int descriptor, struct stat *status) noexcept
    {
        static auto *const real = findNext<int(int, struct stat *)>("fstat");
        return fails("fstat") ? -1 : real(descriptor, status);
    }

#pragma GCC visibility pop
}
