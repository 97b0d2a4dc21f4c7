// SPDX-License-Identifier: MIT
#pragma once

#include <string_view>
#include <vector>

#include "fl/ustring.hpp"
#include "resource_core/BaseMsgID.hpp"

namespace fl::i18n
{

/// Fills the placeholders of a text: "%1%" stands for the first argument, and so on up to "%9%",
/// "%%" for a percent sign. Whatever a translator made of them, nothing is raised but
/// std::bad_alloc: a placeholder without an argument becomes empty, an argument without a
/// placeholder is left out, and a percent sign that means nothing stands for itself.
ustring fillPlaceholders(std::u16string_view text,
                         const std::vector<resource_core::MsgArgument> &arguments);

/// A value as it stands in a text.
void appendArgument(ustring &text, const resource_core::MsgArgument &argument);

} // namespace fl::i18n
