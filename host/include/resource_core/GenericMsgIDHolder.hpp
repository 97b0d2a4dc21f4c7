// SPDX-License-Identifier: MIT
#pragma once

#include <exception>
#include <memory>

#include "resource_core/BaseMsgID.hpp"
#include "vclink_host/export.hpp"

namespace resource_core
{

/// Owns a copy of a message identifier on the heap, or nothing. Copies are deep. A moved-from
/// holder is empty.
class VCLINK_HOST_EXPORT GenericMsgIDHolder
{
  public:
    /// Raised by reading an empty holder.
    class VCLINK_HOST_EXPORT EmptyGenericMsgIDHolder : public std::exception
    {
      public:
        ~EmptyGenericMsgIDHolder() override;
        /// "GenericMsgIDHolder object is empty!\n"
        const char *what() const noexcept override;
    };

    GenericMsgIDHolder() noexcept;
    explicit GenericMsgIDHolder(const BaseMsgID &message);
    GenericMsgIDHolder(const GenericMsgIDHolder &other);
    GenericMsgIDHolder(GenericMsgIDHolder &&other) noexcept;
    GenericMsgIDHolder &operator=(const GenericMsgIDHolder &other);
    GenericMsgIDHolder &operator=(GenericMsgIDHolder &&other) noexcept;
    ~GenericMsgIDHolder();

    /// The held identifier, which lives as long as the holder keeps it.
    /// @throws EmptyGenericMsgIDHolder when there is none, as a copy that Boost.Exception can clone
    const BaseMsgID &get() const;

  private:
    std::unique_ptr<BaseMsgID> message_;
};

} // namespace resource_core
