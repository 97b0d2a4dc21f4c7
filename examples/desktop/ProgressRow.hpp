// SPDX-License-Identifier: MIT
#pragma once

#include <functional>

#include <QLabel>
#include <QProgressBar>
#include <QPushButton>
#include <QWidget>

#include "Runner.hpp"

namespace vclink::desktop
{

/// What runs, how far it is, and Cancel.
class ProgressRow : public QWidget
{
  public:
    ProgressRow(std::function<void()> cancel, QWidget *parent);

    /// @param operation null hides the row
    void display(const Operation *operation, bool canCancel);
    /// Until the first report the bar is a busy one: a transfer reports nothing.
    void setProgress(double fraction, const QString &step);
    void retranslate();

  private:
    QLabel *step_;
    QProgressBar *bar_;
    QPushButton *cancel_;
};

} // namespace vclink::desktop
