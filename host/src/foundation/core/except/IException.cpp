// SPDX-License-Identifier: MIT
#include "foundation/core/except/IException.hpp"

#include <typeinfo>

#include <boost/core/demangle.hpp>

#include "fl/i18n/convert.hpp"
#include "foundation/core/except/IUserException.hpp"

namespace foundation::core::except
{

IException::IException(const IException &other) noexcept : clone_base(other)
{
}

IException &IException::operator=(const IException & /*other*/) noexcept
{
    return *this;
}

IException::~IException() noexcept = default;

const char *IException::what() const noexcept
{
    try
    {
        if (const auto *user = dynamic_cast<const IUserException *>(this))
        {
            text_ = fl::i18n::ustring_to_utf8(user->ToUstringImpl());
            return text_.c_str();
        }
    }
    catch (...)
    {
        // The reported failure matters, not the failure to produce its text.
    }
    try
    {
        text_ = boost::core::demangle(typeid(*this).name());
        return text_.c_str();
    }
    catch (const std::exception &)
    {
        return typeid(*this).name();
    }
}

} // namespace foundation::core::except
