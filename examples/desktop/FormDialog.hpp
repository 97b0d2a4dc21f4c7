// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <vector>

#include <QDialog>
#include <QDialogButtonBox>
#include <QStringList>

class QFormLayout;

namespace vclink::desktop
{

/// Asks for a few texts. Shown with open(); deletes itself when it is closed.
class FormDialog : public QDialog
{
  public:
    using Accepted = std::function<void(const QStringList &values)>;

    FormDialog(const QString &title, Accepted accepted, QWidget *parent);

    /// What is there to read, and not to be answered.
    void addRemark(const QString &label, const QString &text);
    /// One line. All answers are in the order in which they were added.
    void addLine(const QString &label, const QString &value);
    /// Some lines.
    void addText(const QString &label, const QString &value);
    /// One of these, or with `isFree` anything else too.
    void addChoice(const QString &label, const QStringList &choices, const QString &value,
                   bool isFree = false);

  private:
    void addRow(const QString &label, QWidget *field, std::function<QString()> answer);
    /// Every question needs an answer.
    void check();
    QStringList values() const;

    QFormLayout *form_;
    QDialogButtonBox *buttons_;
    std::vector<std::function<QString()>> answers_;
};

} // namespace vclink::desktop
