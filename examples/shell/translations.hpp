// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <vector>

#include "texts.hpp"

/// All that the program says, in German and Japanese, one table a subject. A larger host has
/// catalogues.
namespace vclink::shell
{

struct TranslationTable
{
    const Translation *rows;
    std::size_t size;
};

/// Texts of the command line and its help.
TranslationTable helpTexts();
/// Texts of the help of single commands.
TranslationTable commandHelpTexts();
/// Texts of what commands do.
TranslationTable resultTexts();
/// Texts of why something is not done.
TranslationTable refusalTexts();
/// Of failures, and what to do about them.
TranslationTable failureTexts();

inline const std::vector<TranslationTable> &translationTables()
{
    static const std::vector<TranslationTable> tables{
        helpTexts(), commandHelpTexts(), resultTexts(), refusalTexts(), failureTexts()};
    return tables;
}

} // namespace vclink::shell
