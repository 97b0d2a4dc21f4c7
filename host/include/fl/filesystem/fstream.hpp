// SPDX-License-Identifier: MIT
#pragma once

#include <ios>
#include <istream>
#include <memory>
#include <ostream>
#include <string>

#include "fl/ustring.hpp"
#include "vclink_host/export.hpp"

namespace fl::filesystem
{

/// A stream that reads a file. The file is open from construction to destruction, with a descriptor
/// that child processes do not inherit. If a file cannot be opened, the stream is in a failed
/// state, as with std::basic_ifstream. Throws only std::bad_alloc. Does not open symbolic links, so
/// that a link in the place of a temporary file cannot redirect reads and writes.
template <class Char, class Traits = std::char_traits<Char>>
class VCLINK_HOST_EXPORT basic_ifstream : public std::basic_istream<Char, Traits>
{
  public:
    explicit basic_ifstream(const ustring &name, std::ios_base::openmode mode = std::ios_base::in);
    ~basic_ifstream() override;
    bool is_open() const;
    void close();

  private:
    std::unique_ptr<std::basic_streambuf<Char, Traits>> buffer_;
};

/// A stream that writes a file. Creates or empties the file; with std::ios_base::in it does
/// neither, and the file must exist. Otherwise like basic_ifstream.
template <class Char, class Traits = std::char_traits<Char>>
class VCLINK_HOST_EXPORT basic_ofstream : public std::basic_ostream<Char, Traits>
{
  public:
    explicit basic_ofstream(const ustring &name, std::ios_base::openmode mode = std::ios_base::out);
    ~basic_ofstream() override;
    bool is_open() const;
    /// Flushes and closes the file. A failure sets the stream's failbit.
    void close();

  private:
    std::unique_ptr<std::basic_streambuf<Char, Traits>> buffer_;
};

extern template class basic_ifstream<char>;
extern template class basic_ofstream<char>;

} // namespace fl::filesystem
