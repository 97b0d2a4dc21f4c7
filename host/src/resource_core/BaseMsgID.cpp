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

} // namespace resource_core
