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
/// that child processes do not inherit. A file that can't be opened leaves the stream in a failed
/// state, as std::basic_ifstream does; nothing is raised but std::bad_alloc. A symbolic link can't
/// be opened: nobody who puts one in the place of a temporary file chooses what is read or written.
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

/// A stream that writes a file, which is created or emptied; with std::ios_base::in among the modes
/// it is neither, and has to be there. Otherwise like basic_ifstream.
template <class Char, class Traits = std::char_traits<Char>>
class VCLINK_HOST_EXPORT basic_ofstream : public std::basic_ostream<Char, Traits>
{
  public:
    explicit basic_ofstream(const ustring &name, std::ios_base::openmode mode = std::ios_base::out);
    ~basic_ofstream() override;
    bool is_open() const;
    /// Flushes and closes; a failure of either sets the stream's failbit.
    void close();

  private:
    std::unique_ptr<std::basic_streambuf<Char, Traits>> buffer_;
};

extern template class basic_ifstream<char>;
extern template class basic_ofstream<char>;

} // namespace fl::filesystem
