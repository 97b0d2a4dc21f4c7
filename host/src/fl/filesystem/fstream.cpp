// SPDX-License-Identifier: MIT
#include "fl/filesystem/fstream.hpp"

#include <fcntl.h>
#include <unistd.h>

#include <boost/iostreams/device/file_descriptor.hpp>
#include <boost/iostreams/stream_buffer.hpp>

#include "fl/filesystem/native_name.hpp"

namespace fl::filesystem
{
namespace
{

constexpr mode_t modeOfNewFiles = 0666; // what the process's mask leaves of it

/// The buffer of a stream without a file: it has nothing to read and no space to write.
template <class Char, class Traits>
class ClosedBuffer final : public std::basic_streambuf<Char, Traits>
{
};

template <class Device, class Traits>
using FileBuffer = boost::iostreams::stream_buffer<Device, Traits>;

// Boost opens files without O_CLOEXEC, so the descriptor is opened here and passed to Boost.
int openForReading(const ustring &name, std::ios_base::openmode mode)
{
    const int descriptor = openNative(name, O_RDONLY | O_NOFOLLOW, 0);
    if (descriptor >= 0 && (mode & std::ios_base::ate) != 0)
    {
        ::lseek(descriptor, 0, SEEK_END);
    }
    return descriptor;
}

int openForWriting(const ustring &name, std::ios_base::openmode mode)
{
    const bool append = (mode & std::ios_base::app) != 0;
    const bool update = (mode & std::ios_base::in) != 0 && (mode & std::ios_base::trunc) == 0;
    const int create = update && !append ? 0 : O_CREAT | (append ? O_APPEND : O_TRUNC);
    return openNative(name, O_WRONLY | O_NOFOLLOW | create, modeOfNewFiles);
}

/// Returns a buffer that owns the descriptor, or one without a file if there is no descriptor.
template <class Device, class Char, class Traits>
std::unique_ptr<std::basic_streambuf<Char, Traits>> makeBuffer(int descriptor)
{
    if (descriptor < 0)
    {
        return std::make_unique<ClosedBuffer<Char, Traits>>();
    }
    DescriptorOwner owner(descriptor);
    const Device device(descriptor, boost::iostreams::close_handle);
    owner.release();
    return std::make_unique<FileBuffer<Device, Traits>>(device);
}

template <class Device, class Char, class Traits>
FileBuffer<Device, Traits> *asFileBuffer(std::basic_streambuf<Char, Traits> *buffer)
{
    return dynamic_cast<FileBuffer<Device, Traits> *>(buffer);
}

/// Closes the file, and keeps the state of the stream.
/// @return true if there was a file and everything succeeded
template <class Device, class Stream, class Char, class Traits>
bool closeFile(Stream &stream, std::unique_ptr<std::basic_streambuf<Char, Traits>> &buffer)
{
    FileBuffer<Device, Traits> *file = asFileBuffer<Device>(buffer.get());
    if (file == nullptr)
    {
        return false;
    }
    // close() of the buffer does not report what it could not write.
    bool done = file->pubsync() == 0;
    try
    {
        file->close();
    }
    catch (const std::exception &)
    {
        done = false;
    }
    auto closed = std::make_unique<ClosedBuffer<Char, Traits>>();
    const std::ios_base::iostate state = stream.rdstate();
    stream.rdbuf(closed.get());
    buffer = std::move(closed);
    stream.setstate(state);
    return done;
}

using Source = boost::iostreams::file_descriptor_source;
using Sink = boost::iostreams::file_descriptor_sink;

} // namespace

template <class Char, class Traits>
basic_ifstream<Char, Traits>::basic_ifstream(const ustring &name, std::ios_base::openmode mode)
    : std::basic_istream<Char, Traits>(nullptr),
      buffer_(makeBuffer<Source, Char, Traits>(openForReading(name, mode)))
{
    this->rdbuf(buffer_.get());
    if (!is_open())
    {
        this->setstate(std::ios_base::failbit);
    }
}

template <class Char, class Traits> basic_ifstream<Char, Traits>::~basic_ifstream() = default;

template <class Char, class Traits> bool basic_ifstream<Char, Traits>::is_open() const
{
    return asFileBuffer<Source>(buffer_.get()) != nullptr;
}

template <class Char, class Traits> void basic_ifstream<Char, Traits>::close()
{
    if (!closeFile<Source>(*this, buffer_))
    {
        this->setstate(std::ios_base::failbit);
    }
}

template <class Char, class Traits>
basic_ofstream<Char, Traits>::basic_ofstream(const ustring &name, std::ios_base::openmode mode)
    : std::basic_ostream<Char, Traits>(nullptr),
      buffer_(makeBuffer<Sink, Char, Traits>(openForWriting(name, mode)))
{
    this->rdbuf(buffer_.get());
    if (!is_open())
    {
        this->setstate(std::ios_base::failbit);
    }
}

template <class Char, class Traits> basic_ofstream<Char, Traits>::~basic_ofstream() = default;

template <class Char, class Traits> bool basic_ofstream<Char, Traits>::is_open() const
{
    return asFileBuffer<Sink>(buffer_.get()) != nullptr;
}

template <class Char, class Traits> void basic_ofstream<Char, Traits>::close()
{
    if (!closeFile<Sink>(*this, buffer_))
    {
        this->setstate(std::ios_base::failbit);
    }
}

template class basic_ifstream<char>;
template class basic_ofstream<char>;

} // namespace fl::filesystem
