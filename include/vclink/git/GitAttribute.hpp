// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <variant>

#include "fl/ustring.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// What Git's attribute files say of one attribute for one file. A plain value.
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
        /// The text behind the equals sign.
        ustring value;
    };
    /// Nothing says anything, or `!name`.
    struct Unspecified
    {
    };

    /// The attribute's name.
    ustring name;
    /// Which of the four it is.
    std::variant<Set, Unset, Value, Unspecified> attributeValue;
};

/// Whether name, alternative and, of a value, the text are the same.
VCLINK_GIT_EXPORT bool operator==(const GitAttribute &left, const GitAttribute &right);
VCLINK_GIT_EXPORT bool operator!=(const GitAttribute &left, const GitAttribute &right);

/// The attribute as it stands in a line of an attribute file, UTF-8: "name", "-name", "name=value"
/// or "!name".
/// @throws std::bad_alloc
VCLINK_GIT_EXPORT std::string serialize(const GitAttribute &attribute);

} // namespace vclink::git
