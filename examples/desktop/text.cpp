// SPDX-License-Identifier: MIT
#include "text.hpp"

#include <QStringView>

#include "fl/i18n/convert.hpp"

namespace vclink::desktop
{
namespace
{

/// C0, C1, the marks of direction, and the byte order mark.
bool isHidden(QChar unit)
{
    const char16_t code = unit.unicode();
    return code < 0x20 || (code >= 0x7F && code < 0xA0) || (code >= 0x200B && code <= 0x200F) ||
           (code >= 0x2028 && code <= 0x202E) || (code >= 0x2060 && code <= 0x206F) ||
           code == 0xFEFF;
}

} // namespace

QString toQString(const ustring &text)
{
    return QStringView(text).toString();
}

ustring toUstring(const QString &text)
{
    return text.toStdU16String();
}

QString fromUtf8(const std::string &text)
{
    return toQString(fl::i18n::utf8_to_ustring(text));
}

std::string toUtf8(const QString &text)
{
    return fl::i18n::ustring_to_utf8(toUstring(text));
}

QString printable(const ustring &name)
{
    QString shown;
    const QString text = toQString(name);
    for (qsizetype index = 0; index < text.size(); ++index)
    {
        const QChar unit = text[index];
        const bool pairs =
            unit.isHighSurrogate() && index + 1 < text.size() && text[index + 1].isLowSurrogate();
        if (pairs)
            shown += text.mid(index++, 2);
        else if (unit.isSurrogate())
            shown += QStringLiteral("\\x%1").arg(unit.unicode() & 0xFF, 2, 16, QChar(u'0'));
        else if (isHidden(unit))
            shown += QStringLiteral("\\u%1").arg(unit.unicode(), 4, 16, QChar(u'0'));
        else
            shown += unit;
    }
    return shown;
}

} // namespace vclink::desktop
