// SPDX-License-Identifier: MIT
#include "quoting.hpp"

#include <cstdio>

namespace vclink::test
{

std::string quote(const std::string &path)
{
    std::string text = "\"";
    for (const char character : path)
    {
        const auto byte = static_cast<unsigned char>(character);
        if (character == '"' || character == '\\')
        {
            text += '\\';
            text += character;
        }
        else if (byte < 0x20 || byte > 0x7E)
        {
            char octal[5];
            std::snprintf(octal, sizeof octal, "\\%03o", static_cast<unsigned>(byte));
            text += octal;
        }
        else
        {
            text += character;
        }
    }
    return text + '"';
}

std::string quoteConfigValue(const std::string &value)
{
    std::string text = "\"";
    for (const char character : value)
    {
        switch (character)
        {
        case '\n':
            text += "\\n";
            break;
        case '\t':
            text += "\\t";
            break;
        case '"':
        case '\\':
            text += '\\';
            [[fallthrough]];
        default:
            text += character;
        }
    }
    return text + '"';
}

std::string asFastImportData(const std::string &bytes)
{
    return "data " + std::to_string(bytes.size()) + '\n' + bytes + '\n';
}

std::string joinWithNul(const std::vector<std::string> &paths)
{
    std::string joined;
    for (const auto &path : paths)
        joined += path + '\0';
    return joined;
}

} // namespace vclink::test
