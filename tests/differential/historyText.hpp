// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "Random.hpp"

namespace vclink::test
{

/// The lines of a text, each with its line end.
using Lines = std::vector<std::string>;

Lines splitLines(const std::string &text);
std::string joinLines(const Lines &lines);

/// A line like those of makeText(), which no other text has.
std::string makeUniqueLine(Random &random);
/// 20 to 60 lines, as in a program: some are blank, and some are in every text.
std::string makeText(Random &random);
/// Some bytes that are no text, in records of equal length.
std::string makeBinary(Random &random);
/// Changes one byte of a content that makeBinary() made.
std::string editBinary(Random &random, std::string content);

/// A stretch of a text's lines.
struct Stretch
{
    std::size_t begin = 0;
    std::size_t end = 0;
};
/// The first, second or third third (0, 1 or 2) of the lines, without a line at its edges.
Stretch thirdOf(const std::string &text, std::size_t number);

/// Replaces, inserts or removes up to three lines of a stretch; a text stays between 20 and 60
/// lines long.
std::string editText(Random &random, const std::string &text, Stretch stretch);
std::string replaceLine(const std::string &text, std::size_t number, const std::string &line);
std::string insertLine(const std::string &text, std::size_t number, const std::string &line);
/// Takes six lines of the first half to the end.
std::string moveBlock(Random &random, const std::string &text);

} // namespace vclink::test
