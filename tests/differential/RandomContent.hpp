// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "Random.hpp"

namespace vclink::test
{

/// Bytes of a file: mostly lines, no two of which are alike in all contents, so that files are
/// either much alike or not at all. Also empty, binary and unfinished ones.
std::string makeContent(Random &random);

/// As `content`, one line being another; something else where `content` has too few lines.
std::string makeSimilar(Random &random, const std::string &content);

/// As long as `content`, with one byte changed; something else where `content` is empty.
std::string makeSameSize(Random &random, const std::string &content);

/// The text of an ignore file that some of the names of RandomNames fall under.
std::string makeIgnoreRules(Random &random);

/// What a merge leaves in a file in conflict.
std::string makeConflictMarkers(Random &random);

} // namespace vclink::test
