// SPDX-License-Identifier: MIT
#include "severities.hpp"

#include <algorithm>
#include <charconv>
#include <string_view>

namespace vclink::shell
{
namespace
{

struct Severity
{
    std::string_view name;
    unsigned mask;
};

// The numbers are part of what the library promises a host.
constexpr Severity severities[] = {{"parameter", parameterSeverity},
                                   {"progress", 0x04},
                                   {"diagnostic", 0x08},
                                   {"exception", 0x10},
                                   {"scope-entry", 0x20},
                                   {"scope-exit", 0x40},
                                   {"stack-trace", 0x200},
                                   {"all", 0x27E}};

std::optional<unsigned> parseNumber(std::string_view text)
{
    int base = 10;
    if (text.substr(0, 2) == "0x" || text.substr(0, 2) == "0X")
    {
        text.remove_prefix(2);
        base = 16;
    }
    unsigned number = 0;
    const char *const end = text.data() + text.size();
    const auto [stop, error] = std::from_chars(text.data(), end, number, base);
    return error == std::errc() && stop == end ? std::optional(number) : std::nullopt;
}

std::optional<unsigned> parseName(std::string_view name)
{
    for (const Severity &severity : severities)
    {
        if (severity.name == name)
        {
            return severity.mask;
        }
    }
    return std::nullopt;
}

} // namespace

std::optional<unsigned> parseSeverities(const std::string &text)
{
    if (const std::optional<unsigned> number = parseNumber(text))
    {
        return number;
    }
    unsigned mask = 0;
    for (std::size_t start = 0; start <= text.size();)
    {
        const std::size_t end = std::min(text.find(',', start), text.size());
        const std::optional<unsigned> bits =
            parseName(std::string_view(text).substr(start, end - start));
        if (!bits)
        {
            return std::nullopt;
        }
        mask |= *bits;
        start = end + 1;
    }
    return mask;
}

std::string severityNames()
{
    std::string names;
    for (const Severity &severity : severities)
    {
        names += names.empty() ? "" : ", ";
        names += severity.name;
    }
    return names;
}

std::string severityName(unsigned number)
{
    for (const Severity &severity : severities)
    {
        if (severity.mask == number)
        {
            return std::string(severity.name);
        }
    }
    return std::to_string(number);
}

} // namespace vclink::shell
