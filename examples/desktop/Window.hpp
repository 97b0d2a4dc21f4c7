// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <shared_mutex>
#include <vector>

#include <QAction>
#include <QActionGroup>
#include <QComboBox>
#include <QLabel>
#include <QMainWindow>
#include <QPointer>

#include "BranchCommands.hpp"
#include "ConflictDialog.hpp"
#include "FileCommands.hpp"
#include "FolderWatch.hpp"
#include "LogPane.hpp"
#include "ProgressRow.hpp"
#include "RemoteCommands.hpp"
#include "Runner.hpp"
#include "StatesView.hpp"

namespace vclink::desktop
{

/// A working copy: its files, its branch, what can be done with it, and what the library logs.
class Window : public QMainWindow
{
  public:
    /// @param guards one for all windows of the process; see Work
    explicit Window(std::shared_mutex &guards);
    ~Window() override;

    /// Shows this working copy, if it is one.
    void open(const upath &folder);
    void showConflicts();
    const Snapshot &snapshot() const noexcept
    {
        return *snapshot_;
    }
    Runner &runner() noexcept
    {
        return runner_;
    }
    /// The dialog of showConflicts(), or null.
    ConflictDialog *conflicts() const noexcept
    {
        return conflicts_;
    }
    StatesView &files() noexcept
    {
        return *files_;
    }

  protected:
    void changeEvent(QEvent *event) override;
    /// An operation is never cut off: the window closes when it has ended.
    void closeEvent(QCloseEvent *event) override;

  private:
    enum class Needs
    {
        Nothing,
        WorkingCopy,
        Selection,
        Conflicts,
        Reverted
    };
    struct Command
    {
        QAction *action;
        const char *text;
        Needs needs;
    };
    Context makeContext();
    RunnerListener makeListener();
    void makeCommands();
    void makeLanguages();
    void makeLayout();
    QMenu *addTo(const char *title);
    void addCommand(QMenu *menu, const char *name, const char *text, Needs needs,
                    std::function<void()> act);
    void chooseFolder();
    void refreshed(std::shared_ptr<const Snapshot> snapshot);
    void failed(const Operation &operation, const host_tools::Failure &failure);
    bool isMet(Needs needs) const;
    void update();
    void retranslate();

    std::shared_ptr<const Snapshot> snapshot_ = std::make_shared<Snapshot>();
    StatesView *files_;
    ProgressRow *progress_;
    LogPane *log_;
    QComboBox *severities_;
    QLabel *branch_;
    std::vector<Command> commands_;
    std::vector<std::pair<QMenu *, const char *>> menus_;
    QPointer<ConflictDialog> conflicts_;
    bool isClosing_ = false;
    Runner runner_;
    FileCommands fileCommands_;
    BranchCommands branchCommands_;
    RemoteCommands remoteCommands_;
    FolderWatch watch_;
};

} // namespace vclink::desktop
