// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <utility>
#include <vector>

#include <boost/variant/variant.hpp>

#include "fl/ustring.hpp"
#include "vclink_host/export.hpp"

namespace resource_core
{

/// The value of one placeholder of a message.
using MsgArgument = boost::variant<long, std::string, ustring>;

/// Names a message of a catalogue, with the values of its placeholders in order. A plain value.
class VCLINK_HOST_EXPORT BaseMsgID
{
  public:
    BaseMsgID(std::vector<MsgArgument> arguments, std::string catalogue, std::string key);
    /// The same, inline: the compiler knows the length of a literal, and a checkout makes a message
    /// for every file.
    BaseMsgID(std::vector<MsgArgument> arguments, const char *catalogue, const char *key)
        : arguments_(std::move(arguments)), catalogue_(catalogue), key_(key)
    {
    }
    BaseMsgID(const BaseMsgID &) = default;
    BaseMsgID(BaseMsgID &&) noexcept = default;
    BaseMsgID &operator=(const BaseMsgID &) = default;
    BaseMsgID &operator=(BaseMsgID &&) noexcept = default;
    virtual ~BaseMsgID();

    const std::vector<MsgArgument> &getArguments() const noexcept
    {
        return arguments_;
    }
    const std::string &getCatalogue() const noexcept
    {
        return catalogue_;
    }
    const std::string &getKey() const noexcept
    {
        return key_;
    }

  private:
    std::vector<MsgArgument> arguments_;
    std::string catalogue_;
    std::string key_;
};

} // namespace resource_core
