// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "foundation/core/except/IMsgIDException.hpp"
#include "resource_core/BaseMsgID.hpp"

namespace foundation::core::except
{

/// The exception class of one message identifier. A host catches a particular failure with the
/// identifier's class as Tag.
template <class Tag, class Base, class Enable = void>
class __attribute__((visibility("default"))) Exception : public IMsgIDException, public Base
{
  public:
    Exception(const resource_core::BaseMsgID &message, const Base &base)
        : Base(base), message_(message), id_(IMsgIDException::get_error_id(message))
    {
    }

    /// Returns a copy on the heap. The caller owns it.
    const Exception *clone() const override
    {
        return new Exception(*this);
    }
    /// Throws a copy of this class. The copy has no nested exception of the original.
    void rethrow() const override
    {
        throw Exception(*this);
    }
    const char *what() const noexcept override
    {
        return IException::what();
    }
    std::string GetID() const override
    {
        return id_;
    }
    const resource_core::BaseMsgID &GetBaseMsgIDObj() const override
    {
        return message_;
    }

  private:
    resource_core::BaseMsgID message_;
    std::string id_;
};

} // namespace foundation::core::except
