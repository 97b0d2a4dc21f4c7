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
    /// Thrown if an empty holder is read.
    class VCLINK_HOST_EXPORT EmptyGenericMsgIDHolder : public std::exception
    {
      public:
        ~EmptyGenericMsgIDHolder() override;
        /// Returns "GenericMsgIDHolder object is empty!
        /// ".
        const char *what() const noexcept override;
    };

    GenericMsgIDHolder() noexcept;
    explicit GenericMsgIDHolder(const BaseMsgID &message);
    GenericMsgIDHolder(const GenericMsgIDHolder &other);
    GenericMsgIDHolder(GenericMsgIDHolder &&other) noexcept;
    GenericMsgIDHolder &operator=(const GenericMsgIDHolder &other);
    GenericMsgIDHolder &operator=(GenericMsgIDHolder &&other) noexcept;
    ~GenericMsgIDHolder();

    /// Returns the identifier, which lives as long as the holder keeps it.
    /// @throws EmptyGenericMsgIDHolder if there is none, as a copy that Boost.Exception can clone
    const BaseMsgID &get() const;

  private:
    std::unique_ptr<BaseMsgID> message_;
};

} // namespace resource_core
