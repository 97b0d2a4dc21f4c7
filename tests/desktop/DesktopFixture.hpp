// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <memory>
#include <shared_mutex>
#include <stdexcept>
#include <string>
#include <vector>

#include <QAction>
#include <QLabel>
#include <QMessageBox>
#include <QPushButton>

#include "FormDialog.hpp"
#include "Window.hpp"
#include "support/GitFixture.hpp"

namespace vclink::test
{

/// Lets the window work until something holds.
/// @return whether it did, within half a minute
bool waitFor(const std::function<bool()> &holds);

/// A window on a repository with an identity, handled as a person does.
class DesktopFixture : public GitFixture
{
  protected:
    DesktopFixture();
    ~DesktopFixture() override;

    /// Opens the window on the repository.
    desktop::Window &open();
    /// A window without a working copy.
    desktop::Window &openEmpty();
    desktop::Window &window()
    {
        return *window_;
    }

    /// Chooses a command of a menu, as soon as it can be chosen.
    void choose(const std::string &command);
    /// Selects these files, and no others.
    void select(const std::vector<std::string> &names);
    /// Answers the questions of the form that is shown, in their order, and accepts.
    void fill(const QStringList &values);
    /// The visible dialog of this type, waited for.
    template <class Dialog> Dialog &shown()
    {
        Dialog *found = nullptr;
        waitFor(
            [&]
            {
                // Qt itself takes classes without Q_OBJECT for their base.
                for (auto *dialog : window_->findChildren<QDialog *>())
                {
                    if (dialog->isVisible() && dynamic_cast<Dialog *>(dialog) != nullptr)
                        found = dynamic_cast<Dialog *>(dialog);
                }
                return found != nullptr;
            });
        if (found == nullptr)
            throw std::runtime_error("no such dialog is shown");
        return *found;
    }
    /// Its text; the box is closed.
    std::string takeMessage();
    /// Clicks Yes in the question that is shown.
    void confirm();
    template <class Widget> Widget &find(const char *name)
    {
        return *window_->findChild<Widget *>(QString::fromLatin1(name));
    }
    /// Waits until nothing is under way and the list is up to date.
    void settle();
    /// The word for the file's state in the list, e.g. "modified"; empty for a file that is not in
    /// it.
    std::string stateOf(const std::string &name);
    /// Waits for it.
    bool becomes(const std::string &name, const std::string &state);
    /// What git says, without its ends of lines.
    std::string status() const;

    GitRepository repository_ = makeRepository();
    std::shared_mutex guards_;

  private:
    std::unique_ptr<desktop::Window> window_;
};

} // namespace vclink::test
