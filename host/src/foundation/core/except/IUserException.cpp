// SPDX-License-Identifier: MIT
#include "foundation/core/except/IUserException.hpp"

#include "fl/i18n/convert.hpp"

namespace foundation::core::except
{

IUserException::~IUserException() noexcept = default;

ustring IUserException::convert_str(const ustring &text) const
{
    return text;
}

ustring IUserException::convert_str(const std::string &text) const
{
    return fl::i18n::utf8_to_ustring(text);
}

ustring IUserException::ToUstringImpl() const
{
    return convert_str(GetUnicodeMessageTxt());
}

} // namespace foundation::core::except
