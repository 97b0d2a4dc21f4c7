// SPDX-License-Identifier: MIT
#pragma once

#include <functional>

#include <QString>

#include "hostTools.hpp"

class QWidget;

/// Boxes with a text, which do not stop the window. Each deletes itself when it is closed.
namespace vclink::desktop
{

QString textOf(const host_tools::Failure &failure);
void showMessage(QWidget *parent, const QString &text);
/// The library's text, with advice for this kind of failure, and details that can be shown.
void showFailure(QWidget *parent, const QString &title, const host_tools::Failure &failure);
/// @param confirmed called if the person says yes
void askFor(QWidget *parent, const QString &question, std::function<void()> confirmed);

} // namespace vclink::desktop
