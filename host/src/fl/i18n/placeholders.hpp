// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace fl::i18n
{

/// Fills the placeholders of a text: "%1%" stands for the first argument, and so on up to "%9%",
/// "%%" for a percent sign. Whatever a translator made of them, nothing is raised but
/// std::bad_alloc: a placeholder without an argument becomes empty, an argument without a
/// placeholder is left out, and a percent sign that means nothing stands for itself.
std::string fillPlaceholders(std::string_view text, const std::vector<std::string> &arguments);

} // namespace fl::i18n
