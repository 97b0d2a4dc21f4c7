// SPDX-License-Identifier: MIT
#pragma once

#include <algorithm>
#include <string>
#include <vector>

namespace vclink::test
{

/// The pieces of a text, each of which ends with `end`; the last one may lack it.
inline std::vector<std::string> split(const std::string &text, char end = '\n')
{
    std::vector<std::string> pieces;
    for (std::size_t start = 0; start < text.size();)
    {
        const std::size_t stop = std::min(text.find(end, start), text.size());
        pieces.push_back(text.substr(start, stop - start));
        start = stop + 1;
    }
    return pieces;
}

inline bool startsWith(const std::string &text, const std::string &beginning)
{
    return text.compare(0, beginning.size(), beginning) == 0;
}

} // namespace vclink::test
