// SPDX-License-Identifier: MIT
#include "check.hpp"

#include <algorithm>
#include <cstdio>
#include <cstdlib>

namespace vclink::fuzz
{

void require(bool holds, const char *promise)
{
    if (!holds)
    {
        std::fprintf(stderr, "not kept: %s\n", promise);
        std::abort();
    }
}

std::string bytesOf(const std::uint8_t *data, std::size_t size)
{
    return std::string(reinterpret_cast<const char *>(data), size);
}

std::vector<std::string> cut(const std::string &input, char separator, std::size_t pieces)
{
    std::vector<std::string> cut;
    std::size_t begin = 0;
    while (cut.size() + 1 < pieces)
    {
        const std::size_t end = std::min(input.find(separator, begin), input.size());
        cut.push_back(input.substr(begin, end - begin));
        begin = std::min(end + 1, input.size());
    }
    cut.push_back(input.substr(begin));
    return cut;
}

} // namespace vclink::fuzz
