// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include <QString>

#include "fl/ustring.hpp"

namespace vclink::desktop
{

/// Both are UTF-16, and nothing is changed: neither the lone surrogates that represent bytes that
/// are not UTF-8, nor a byte order mark at the beginning, which QString::fromUtf16 would drop.
QString toQString(const ustring &text);
ustring toUstring(const QString &text);

/// For names that the library takes as UTF-8, such as branches.
QString fromUtf8(const std::string &text);
std::string toUtf8(const QString &text);

/// A name as it can be shown: bytes that are not UTF-8, control characters and marks that change
/// the direction or can't be seen are escaped.
QString printable(const ustring &name);

} // namespace vclink::desktop
