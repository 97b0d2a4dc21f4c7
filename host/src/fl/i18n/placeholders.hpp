// SPDX-License-Identifier: MIT
#pragma once

#include <string_view>
#include <vector>

#include "fl/ustring.hpp"
#include "resource_core/BaseMsgID.hpp"

namespace fl::i18n
{

/// Replaces the placeholders of a text: "%1%" by the first argument, and so on up to "%9%", and
/// "%%" by a percent sign. Accepts errors of translators and throws only std::bad_alloc: a
/// placeholder without an argument becomes empty, an argument without a placeholder is left out,
/// and any other percent sign is unchanged.
ustring fillPlaceholders(std::u16string_view text,
                         const std::vector<resource_core::MsgArgument> &arguments);

/// Returns a value as text.
void appendArgument(ustring &text, const resource_core::MsgArgument &argument);

} // namespace fl::i18n
