// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "fl/ustring.hpp"
#include "foundation/core/except/IException.hpp"
#include "resource_core/BaseMsgID.hpp"
#include "vclink_host/export.hpp"

namespace foundation::core::except
{

/// An exception whose text can be shown to a user. The order of the virtual operations is binding.
class VCLINK_HOST_EXPORT IUserException : public IException
{
  public:
    ~IUserException() noexcept override;

    /// Returns the text unchanged.
    virtual ustring convert_str(const ustring &text) const;
    /// Returns UTF-8 text as UTF-16.
    virtual ustring convert_str(const std::string &text) const;
    /// Returns the text of the exception: convert_str of GetUnicodeMessageTxt().
    virtual ustring ToUstringImpl() const;
    /// Returns the identifier of the message as text.
    virtual std::string GetID() const = 0;
    /// Returns the message in the current locale of the process.
    virtual ustring GetUnicodeMessageTxt() const = 0;
    /// Returns the identifier of the message, which lives as long as the exception.
    virtual const resource_core::BaseMsgID &GetBaseMsgIDObj() const = 0;
};

} // namespace foundation::core::except
