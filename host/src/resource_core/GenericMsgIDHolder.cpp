// SPDX-License-Identifier: MIT
#include "resource_core/GenericMsgIDHolder.hpp"

#include <boost/exception/enable_current_exception.hpp>

namespace resource_core
{
namespace
{

std::unique_ptr<BaseMsgID> copy(const std::unique_ptr<BaseMsgID> &message)
{
    return message ? std::make_unique<BaseMsgID>(*message) : nullptr;
}

} // namespace

GenericMsgIDHolder::EmptyGenericMsgIDHolder::~EmptyGenericMsgIDHolder() = default;

const char *GenericMsgIDHolder::EmptyGenericMsgIDHolder::what() const noexcept
{
    return "GenericMsgIDHolder object is empty!\n";
}

GenericMsgIDHolder::GenericMsgIDHolder() noexcept = default;

GenericMsgIDHolder::GenericMsgIDHolder(const BaseMsgID &message)
    : message_(std::make_unique<BaseMsgID>(message))
{
}

GenericMsgIDHolder::GenericMsgIDHolder(const GenericMsgIDHolder &other)
    : message_(copy(other.message_))
{
}

GenericMsgIDHolder::GenericMsgIDHolder(GenericMsgIDHolder &&other) noexcept = default;

GenericMsgIDHolder &GenericMsgIDHolder::operator=(const GenericMsgIDHolder &other)
{
    message_ = copy(other.message_);
    return *this;
}

GenericMsgIDHolder &GenericMsgIDHolder::operator=(GenericMsgIDHolder &&other) noexcept = default;

GenericMsgIDHolder::~GenericMsgIDHolder() = default;

const BaseMsgID &GenericMsgIDHolder::get() const
{
    if (!message_)
    {
        throw boost::enable_current_exception(EmptyGenericMsgIDHolder());
    }
    return *message_;
}

} // namespace resource_core
