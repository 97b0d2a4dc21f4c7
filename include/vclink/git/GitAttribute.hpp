// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <variant>

#include "fl/ustring.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// The value of one Git attribute for one file. A plain value.
class VCLINK_GIT_EXPORT GitAttribute
{
  public:
    /// `name`
    struct Set
    {
    };
    /// `-name`
    struct Unset
    {
    };
    /// `name=value`
    struct Value
    {
        /// The text after the equals sign.
        ustring value;
    };
    /// `!name`, or no attribute file names it.
    struct Unspecified
    {
    };

    /// The attribute's name.
    ustring name;
    /// One of the four kinds.
    std::variant<Set, Unset, Value, Unspecified> attributeValue;
};

/// Returns true if name, kind and (for values) text are equal.
VCLINK_GIT_EXPORT bool operator==(const GitAttribute &left, const GitAttribute &right);
VCLINK_GIT_EXPORT bool operator!=(const GitAttribute &left, const GitAttribute &right);

/// Returns the attribute as it is written in an attribute file, UTF-8: "name", "-name",
/// "name=value" or "!name".
/// @throws std::bad_alloc
VCLINK_GIT_EXPORT std::string serialize(const GitAttribute &attribute);

} // namespace vclink::git
