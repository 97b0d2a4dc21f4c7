// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <boost/exception/exception.hpp>

#include "fl/ustring.hpp"
#include "foundation/core/except/IUserException.hpp"
#include "resource_core/BaseMsgID.hpp"
#include "vclink_host/export.hpp"

namespace foundation::core::except
{

/// A user exception whose text is a message of a catalogue.
class VCLINK_HOST_EXPORT IMsgIDException : public IUserException, public boost::exception
{
  public:
    ~IMsgIDException() noexcept override;

    /// Returns catalogue + ":" + key.
    static std::string get_error_id(const resource_core::BaseMsgID &message);

    /// Returns the catalogue's text of GetBaseMsgIDObj() in fl::i18n::VkLocale::global().
    ustring GetUnicodeMessageTxt() const override;
};

} // namespace foundation::core::except
