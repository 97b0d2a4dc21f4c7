// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <boost/exception/exception.hpp>

#include "vclink_host/export.hpp"

namespace foundation::core::except
{

/// Root of the host's exceptions. Clone and rethrow come from Boost.Exception, whose table of
/// virtual operations begins with them.
class VCLINK_HOST_EXPORT IException : public boost::exception_detail::clone_base
{
  public:
    ~IException() noexcept override;

    /// The narrow text: that of IUserException::ToUstringImpl in UTF-8 where the exception is an
    /// IUserException, otherwise the class's name; also the class's name when the text can't be
    /// produced. The text is made at each call, and lives until the next one on the same object or
    /// the object's end. Not to be called from two threads at once on one object.
    virtual const char *what() const noexcept;

  protected:
    IException() = default;
    /// The text that what() made is not copied.
    IException(const IException &) noexcept;
    IException &operator=(const IException &) noexcept;

  private:
    mutable std::string text_;
};

} // namespace foundation::core::except
