// SPDX-License-Identifier: MIT
#pragma once

#include <ostream>
#include <string>

namespace vclink::test
{

/// Base of the rows of a table: with testing::PrintToStringParamName() the sentence is the name of
/// the row's test.
struct Sentence
{
    std::string sentence;
};

inline std::ostream &operator<<(std::ostream &stream, const Sentence &row)
{
    return stream << row.sentence;
}

} // namespace vclink::test
