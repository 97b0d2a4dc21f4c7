// SPDX-License-Identifier: MIT
#include "util/lock/IndexCopy.hpp"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstddef>
#include <ctime>
#include <utility>

#include <fcntl.h>

#include "error/errorUtil/raiseSystemError.hpp"
#include "util/scope/newFile.hpp"

namespace vclink::git
{
namespace
{

constexpr std::size_t blockSize = std::size_t{32} * 1024;

[[noreturn]] void raiseUnreadable(int error, const std::string &index)
{
    raiseSystemError(error, "failed to read index: '" + index + "'", GIT_ERROR_INDEX);
}

[[noreturn]] void raiseUncopied(int error, const std::string &copy)
{
    raiseSystemError(error, "could not copy the index to '" + copy + "'");
}

void removeIfThere(const std::string &path)
{
    if (::unlink(path.c_str()) != 0 && errno != ENOENT)
    {
        raiseSystemError(errno, "could not remove '" + path + "'");
    }
}

} // namespace

IndexCopy::IndexCopy(std::string index, std::string path)
    : index_(std::move(index)), path_(std::move(path))
{
}

IndexCopy::IndexCopy(const std::string &index, IndexTime time) : IndexCopy(index, index + ".vclink")
{
    removeIfThere(path_);
    // The lock that libgit2 uses to write the copy.
    removeIfThere(path_ + ".lock");
    const FileDescriptor source(::open(index_.c_str(), O_RDONLY | O_CLOEXEC));
    if (source)
    {
        copyFrom(source, time);
    }
    else if (errno != ENOENT)
    {
        raiseUnreadable(errno, index_);
    }
}

IndexCopy::~IndexCopy()
{
    ::unlink(path_.c_str());
}

void IndexCopy::copyFrom(const FileDescriptor &source, IndexTime time)
{
    struct stat status = {};
    if (::fstat(source.get(), &status) != 0)
    {
        raiseUnreadable(errno, index_);
    }
    copy_ = FileDescriptor(
        ::open(path_.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, S_IRUSR | S_IWUSR));
    if (!copy_)
    {
        raiseUncopied(errno, path_);
    }
    copyContent(source, static_cast<std::size_t>(status.st_size));
    const long fraction = time == IndexTime::Fraction ? status.st_mtim.tv_nsec : 0;
    const std::array<timespec, 2> times{timespec{0, UTIME_OMIT},
                                        timespec{status.st_mtim.tv_sec, fraction}};
    if (::futimens(copy_.get(), times.data()) != 0 || ::fstat(copy_.get(), &copied_) != 0)
    {
        raiseUncopied(errno, path_);
    }
}

void IndexCopy::copyContent(const FileDescriptor &source, std::size_t size) const
{
    // One byte more than expected, to detect the end without another block.
    std::string block(std::min(size + 1, blockSize), '\0');
    for (;;)
    {
        const ssize_t count = ::read(source.get(), block.data(), block.size());
        if (count == 0)
        {
            return;
        }
        if (count < 0 && errno != EINTR)
        {
            raiseUnreadable(errno, index_);
        }
        const std::size_t read = count < 0 ? 0 : static_cast<std::size_t>(count);
        const int error = writeAll(copy_, block.data(), read);
        if (error != 0)
        {
            raiseUncopied(error, path_);
        }
    }
}

int IndexCopy::replaceIndex() const noexcept
{
    struct stat now = {};
    if (::stat(path_.c_str(), &now) != 0)
    {
        return errno == ENOENT ? 0 : errno;
    }
    const bool isWritten = now.st_ino != copied_.st_ino || now.st_dev != copied_.st_dev;
    return isWritten && ::rename(path_.c_str(), index_.c_str()) != 0 ? errno : 0;
}

} // namespace vclink::git
