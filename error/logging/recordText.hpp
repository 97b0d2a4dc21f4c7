// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <string_view>
#include <type_traits>

namespace vclink::git::detail
{

inline void appendToRecord(std::string &record, std::string_view text)
{
    record.append(text);
}

/// A null pointer adds nothing: libgit2 passes such pointers, and a record must not fail on them.
inline void appendToRecord(std::string &record, const char *text)
{
    if (text != nullptr)
    {
        record.append(text);
    }
}

/// Numbers are decimal. A function is replaced by its result.
template <
    class Value,
    std::enable_if_t<std::is_arithmetic_v<Value> || std::is_invocable_v<const Value &>, int> = 0>
void appendToRecord(std::string &record, const Value &value)
{
    if constexpr (std::is_arithmetic_v<Value>)
    {
        record.append(std::to_string(value));
    }
    else
    {
        appendToRecord(record, value());
    }
}

} // namespace vclink::git::detail
