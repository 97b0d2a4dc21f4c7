// SPDX-License-Identifier: MIT
#include "messages.hpp"

#include <utility>

#include <QMessageBox>

#include "language.hpp"
#include "owned.hpp"
#include "text.hpp"

namespace vclink::desktop
{
namespace
{

QMessageBox *makeBox(QWidget *parent, QMessageBox::Icon icon, const QString &text)
{
    auto *const box = makeOwned<QMessageBox>(parent);
    box->setObjectName(QStringLiteral("message"));
    box->setAttribute(Qt::WA_DeleteOnClose);
    box->setTextFormat(Qt::PlainText);
    box->setIcon(icon);
    box->setText(text);
    return box;
}

} // namespace

QString textOf(const host_tools::Failure &failure)
{
    // Those of the library are in the right language.
    return failure.kind == host_tools::FailureKind::Other
               ? say(fl::i18n::ustring_to_utf8(failure.text).c_str())
               : toQString(failure.text);
}

void showMessage(QWidget *parent, const QString &text)
{
    makeBox(parent, QMessageBox::Information, text)->open();
}

void showFailure(QWidget *parent, const QString &title, const host_tools::Failure &failure)
{
    auto *const box = makeBox(parent, QMessageBox::Warning, textOf(failure));
    box->setWindowTitle(title);
    if (failure.isLocked())
        box->setInformativeText(say("Another program works here. Try again in a moment."));
    box->setDetailedText(
        QString::fromStdString(failure.id) +
        (failure.code == 0 ? QString() : QStringLiteral("\nlibgit2: %1").arg(failure.code)) +
        (failure.files.empty() ? QString() : u'\n' + toQString(failure.files)));
    box->open();
}

void askFor(QWidget *parent, const QString &question, std::function<void()> confirmed)
{
    auto *const box = makeBox(parent, QMessageBox::Question, question);
    box->setStandardButtons(QMessageBox::Yes | QMessageBox::Cancel);
    box->setDefaultButton(QMessageBox::Cancel);
    QObject::connect(box, &QMessageBox::finished, box,
                     [confirmed = std::move(confirmed)](int answer)
                     {
                         if (answer == QMessageBox::Yes)
                             confirmed();
                     });
    box->open();
}

} // namespace vclink::desktop
