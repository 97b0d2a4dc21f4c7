// SPDX-License-Identifier: MIT
#include "ProgressRow.hpp"

#include <QHBoxLayout>

#include "language.hpp"
#include "owned.hpp"

namespace vclink::desktop
{
namespace
{

constexpr int steps = 1'000;

} // namespace

ProgressRow::ProgressRow(std::function<void()> cancel, QWidget *parent)
    : QWidget(parent), step_(makeOwned<QLabel>(this)), bar_(makeOwned<QProgressBar>(this)),
      cancel_(makeOwned<QPushButton>(this))
{
    setObjectName(QStringLiteral("progress"));
    step_->setTextFormat(Qt::PlainText);
    bar_->setObjectName(QStringLiteral("bar"));
    cancel_->setObjectName(QStringLiteral("cancel"));
    auto *const row = makeOwned<QHBoxLayout>(this);
    row->setContentsMargins({});
    row->addWidget(step_, 1);
    row->addWidget(bar_, 1);
    row->addWidget(cancel_);
    connect(cancel_, &QPushButton::clicked, this, std::move(cancel));
    display(nullptr, false);
    retranslate();
}

void ProgressRow::display(const Operation *operation, bool canCancel)
{
    if (operation == nullptr)
    {
        bar_->setRange(0, 0);
        step_->clear();
    }
    else if (step_->text().isEmpty())
    {
        step_->setText(operation->title);
    }
    cancel_->setEnabled(canCancel);
    setVisible(operation != nullptr);
}

void ProgressRow::setProgress(double fraction, const QString &step)
{
    bar_->setRange(0, steps);
    bar_->setValue(static_cast<int>(fraction * steps));
    if (!step.isEmpty())
        step_->setText(step);
}

void ProgressRow::retranslate()
{
    cancel_->setText(say("Cancel"));
}

} // namespace vclink::desktop
