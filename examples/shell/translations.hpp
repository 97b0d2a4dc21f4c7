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

/// Of the command line and its help.
TranslationTable helpTexts();
/// Of the help of the single commands.
TranslationTable commandHelpTexts();
/// Of what commands do.
TranslationTable resultTexts();
/// Of why something is not done.
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
