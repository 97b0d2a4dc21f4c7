// SPDX-License-Identifier: MIT
#include "main/remote/remotePath.hpp"

#include <charconv>
#include <cstddef>
#include <string_view>

#include "main/remote/Refspec.hpp"

namespace vclink::git
{
namespace
{

/// Replaces "%20" and the like.
std::string decode(std::string_view text)
{
    constexpr std::size_t digits = 2;
    std::string decoded;
    for (std::size_t place = 0; place < text.size(); ++place)
    {
        char character = text[place];
        if (character == '%' && place + digits < text.size())
        {
            constexpr int base = 16;
            unsigned char byte = 0;
            const char *const begin = text.data() + place + 1;
            if (std::from_chars(begin, begin + digits, byte, base).ptr == begin + digits)
            {
                character = static_cast<char>(byte);
                place += digits;
            }
        }
        decoded += character;
    }
    return decoded;
}

} // namespace

std::optional<std::string> findRemotePath(const std::string &address)
{
    constexpr std::string_view scheme = "file://";
    if (isIn(scheme, address))
    {
        const std::string path = address.substr(scheme.size());
        const std::size_t slash = path.find('/');
        return slash == std::string::npos ? std::nullopt
                                          : std::optional(decode(path.substr(slash)));
    }
    // Everything else with a colon has a scheme or a host.
    return address.find(':') == std::string::npos ? std::optional(address) : std::nullopt;
}

} // namespace vclink::git
