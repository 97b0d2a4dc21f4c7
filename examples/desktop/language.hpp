// SPDX-License-Identifier: MIT
#pragma once

#include <QString>

namespace vclink::desktop
{

/// The window's own words in the language that was set last.
QString say(const char *english);

/// Sets the language of the window and of the library's messages: "en", "de" or "ja". The
/// application's widgets get QEvent::LanguageChange.
void setLanguage(const QString &language);

} // namespace vclink::desktop
