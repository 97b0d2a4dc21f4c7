// SPDX-License-Identifier: MIT
#pragma once

#include <exception>
#include <utility>

#include "foundation/core/except/Exception.hpp"
#include "vclink/exception/SourceControlException.hpp"

namespace vclink::git
{

/// The exception class of a message identifier.
template <class Tag>
using TagException =
    foundation::core::except::Exception<Tag, vclink::exception::SourceControlException>;

/// Throws the identifier's own exception class. If another exception is being handled, it is nested
/// in the new one.
template <class Tag> [[noreturn]] void raise(const Tag &message)
{
    const vclink::exception::SourceControlException base;
    // Not const: the class of a nested exception is derived from exactly this type.
    TagException<Tag> exception(message, base);
    if (std::current_exception() != nullptr)
    {
        std::throw_with_nested(std::move(exception));
    }
    throw exception;
}

} // namespace vclink::git
