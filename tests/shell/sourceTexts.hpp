// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <set>
#include <string>

namespace vclink::test
{

/// The texts in a program's sources.
struct SourceTexts
{
    /// what is given to say() and sayCount()
    std::set<std::string> said;
    /// all others
    std::set<std::string> others;
};

/// Reads the C++ sources of a folder, tables of translations left out.
SourceTexts readSourceTexts(const std::filesystem::path &folder);

} // namespace vclink::test
