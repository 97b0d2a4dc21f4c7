// SPDX-License-Identifier: MIT
#include "resource_core/BaseMsgID.hpp"

#include <utility>

namespace resource_core
{

BaseMsgID::BaseMsgID(std::vector<MsgArgument> arguments, std::string catalogue, std::string key)
    : arguments_(std::move(arguments)), catalogue_(std::move(catalogue)), key_(std::move(key))
{
}

BaseMsgID::~BaseMsgID() = default;

const std::vector<MsgArgument> &BaseMsgID::getArguments() const noexcept
{
    return arguments_;
}

const std::string &BaseMsgID::getCatalogue() const noexcept
{
    return catalogue_;
}

const std::string &BaseMsgID::getKey() const noexcept
{
    return key_;
}

} // namespace resource_core
