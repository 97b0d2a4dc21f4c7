// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <boost/exception/exception.hpp>

#include "vclink_host/export.hpp"

namespace foundation::core::except
{

/// Root of the host's exceptions. Clone and rethrow are those of Boost.Exception, whose virtual
/// table begins with them.
class VCLINK_HOST_EXPORT IException : public boost::exception_detail::clone_base
{
  public:
    ~IException() noexcept override;

    /// Returns the narrow text: that of IUserException::ToUstringImpl in UTF-8 if the exception is
    /// an IUserException. Returns the class's name for others, and if the text cannot be produced.
    /// The text is made at each call, and lives until the next call on the same object or the
    /// object's end. Must not be called from two threads at once on one object.
    virtual const char *what() const noexcept;

  protected:
    IException() = default;
    /// The text of what() is not copied.
    IException(const IException &) noexcept;
    IException &operator=(const IException &) noexcept;

  private:
    mutable std::string text_;
};

} // namespace foundation::core::except
