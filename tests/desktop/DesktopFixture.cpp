// SPDX-License-Identifier: MIT
#include "DesktopFixture.hpp"

#include <chrono>
#include <stdexcept>

#include <QComboBox>
#include <QCoreApplication>
#include <QDialogButtonBox>
#include <QEventLoop>
#include <QFormLayout>
#include <QLineEdit>
#include <QPlainTextEdit>

#include "hostTools.hpp"
#include "language.hpp"
#include "text.hpp"

namespace vclink::test
{

bool waitFor(const std::function<bool()> &holds)
{
    const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(30);
    while (!holds())
    {
        if (std::chrono::steady_clock::now() > end)
            return false;
        QCoreApplication::processEvents(QEventLoop::AllEvents, 10);
        // What is closed is gone only then.
        QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    return true;
}

DesktopFixture::DesktopFixture()
{
    repository_.identify("Ada", "ada@example.org");
    desktop::setLanguage(QStringLiteral("en"));
}

DesktopFixture::~DesktopFixture() = default;

desktop::Window &DesktopFixture::openEmpty()
{
    window_ = std::make_unique<desktop::Window>(guards_);
    window_->show();
    return *window_;
}

desktop::Window &DesktopFixture::open()
{
    openEmpty().open(host_tools::toUpath(repository_.path()));
    settle();
    return *window_;
}

void DesktopFixture::choose(const std::string &command)
{
    auto &action = find<QAction>(command.c_str());
    if (!waitFor([&action] { return action.isEnabled(); }))
        throw std::runtime_error(command + " can't be chosen");
    action.trigger();
}

void DesktopFixture::select(const std::vector<std::string> &names)
{
    std::vector<upath> files;
    for (const auto &name : names)
        files.push_back(host_tools::toUpath(repository_ / name));
    window_->files().select(files);
}

void DesktopFixture::fill(const QStringList &values)
{
    auto &form = shown<desktop::FormDialog>();
    const auto &rows = *form.findChild<QFormLayout *>();
    qsizetype answered = 0;
    for (int row = 0; row < rows.rowCount() && answered < values.size(); ++row)
    {
        const auto *item = rows.itemAt(row, QFormLayout::FieldRole);
        QWidget *const field = item == nullptr ? nullptr : item->widget();
        if (auto *line = qobject_cast<QLineEdit *>(field))
            line->setText(values[answered++]);
        else if (auto *text = qobject_cast<QPlainTextEdit *>(field))
            text->setPlainText(values[answered++]);
        else if (auto *box = qobject_cast<QComboBox *>(field))
            box->setCurrentText(values[answered++]);
    }
    form.findChild<QDialogButtonBox *>()->button(QDialogButtonBox::Ok)->click();
}

std::string DesktopFixture::takeMessage()
{
    auto &box = shown<QMessageBox>();
    const std::string text = desktop::toUtf8(box.text());
    box.close();
    return text;
}

void DesktopFixture::confirm()
{
    shown<QMessageBox>().button(QMessageBox::Yes)->click();
}

void DesktopFixture::settle()
{
    if (!waitFor([this] { return window_->runner().isSettled(); }))
        throw std::runtime_error("something is still under way");
}

std::string DesktopFixture::stateOf(const std::string &name)
{
    const auto &states = window_->snapshot().states;
    const auto found = states.find(host_tools::toUpath(repository_ / name));
    return found == states.end() ? "" : host_tools::nameOf(found->second);
}

bool DesktopFixture::becomes(const std::string &name, const std::string &state)
{
    return waitFor([&] { return stateOf(name) == state; });
}

std::string DesktopFixture::status() const
{
    std::string text = repository_.git({"status", "--porcelain", "-uall"});
    if (!text.empty())
        text.pop_back();
    return text;
}

} // namespace vclink::test
