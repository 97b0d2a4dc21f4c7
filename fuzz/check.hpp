// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string>
#include <vector>

/// What libFuzzer, and the replay of the corpora, call with each input.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size);

namespace vclink::fuzz
{

/// Ends the process by a signal when a promise is not kept, after saying which.
void require(bool holds, const char *promise);

/// An input's bytes.
std::string bytesOf(const std::uint8_t *data, std::size_t size);

/// The input cut at each separator, into this many pieces: those that it lacks are empty, and the
/// last one takes what is left.
std::vector<std::string> cut(const std::string &input, char separator, std::size_t pieces);

} // namespace vclink::fuzz
