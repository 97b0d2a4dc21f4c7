// SPDX-License-Identifier: MIT
#include "FormDialog.hpp"

#include <algorithm>
#include <utility>

#include <QComboBox>
#include <QFormLayout>
#include <QLabel>
#include <QLineEdit>
#include <QPlainTextEdit>
#include <QPushButton>

#include "owned.hpp"

namespace vclink::desktop
{

FormDialog::FormDialog(const QString &title, Accepted accepted, QWidget *parent)
    : QDialog(parent), form_(makeOwned<QFormLayout>(this)),
      buttons_(makeOwned<QDialogButtonBox>(
          this, QDialogButtonBox::StandardButtons(QDialogButtonBox::Ok | QDialogButtonBox::Cancel)))
{
    setObjectName(QStringLiteral("form"));
    setWindowTitle(title);
    setAttribute(Qt::WA_DeleteOnClose);
    form_->addRow(buttons_);
    connect(buttons_, &QDialogButtonBox::accepted, this, &QDialog::accept);
    connect(buttons_, &QDialogButtonBox::rejected, this, &QDialog::reject);
    connect(this, &QDialog::accepted, this,
            [this, accepted = std::move(accepted)] { accepted(values()); });
}

void FormDialog::addRemark(const QString &label, const QString &text)
{
    auto *const remark = makeOwned<QLabel>(this);
    remark->setTextFormat(Qt::PlainText);
    remark->setWordWrap(true);
    remark->setText(text);
    form_->insertRow(form_->rowCount() - 1, label, remark);
}

void FormDialog::addLine(const QString &label, const QString &value)
{
    auto *const line = makeOwned<QLineEdit>(this);
    line->setText(value);
    line->setMinimumWidth(fontMetrics().averageCharWidth() * 50);
    connect(line, &QLineEdit::textChanged, this, [this] { check(); });
    addRow(label, line, [line] { return line->text(); });
}

void FormDialog::addText(const QString &label, const QString &value)
{
    auto *const text = makeOwned<QPlainTextEdit>(this);
    text->setPlainText(value);
    connect(text, &QPlainTextEdit::textChanged, this, [this] { check(); });
    addRow(label, text, [text] { return text->toPlainText(); });
}

void FormDialog::addChoice(const QString &label, const QStringList &choices, const QString &value,
                           bool isFree)
{
    auto *const box = makeOwned<QComboBox>(this);
    box->setEditable(isFree);
    box->addItems(choices);
    box->setCurrentText(value);
    connect(box, &QComboBox::currentTextChanged, this, [this] { check(); });
    addRow(label, box, [box] { return box->currentText(); });
}

void FormDialog::addRow(const QString &label, QWidget *field, std::function<QString()> answer)
{
    answers_.push_back(std::move(answer));
    form_->insertRow(form_->rowCount() - 1, label, field);
    check();
}

void FormDialog::check()
{
    const QStringList all = values();
    buttons_->button(QDialogButtonBox::Ok)
        ->setEnabled(std::none_of(all.begin(), all.end(),
                                  [](const QString &text) { return text.trimmed().isEmpty(); }));
}

QStringList FormDialog::values() const
{
    QStringList all;
    for (const auto &answer : answers_)
        all += answer();
    return all;
}

} // namespace vclink::desktop
