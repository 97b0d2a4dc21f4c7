// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <functional>
#include <memory>

#include <QDialog>
#include <QLabel>
#include <QListWidget>
#include <QPlainTextEdit>
#include <QPushButton>

class QGridLayout;

#include "Context.hpp"
#include "MergeTool.hpp"
#include "gitProgram.hpp"

namespace vclink::desktop
{

/// The files in conflict, the versions of one, and the ways on. Follows the window's snapshots;
/// deletes itself when it is closed.
class ConflictDialog : public QDialog
{
  public:
    /// @param conclude asks for the message of the commit
    ConflictDialog(Context context, std::function<void()> conclude, QWidget *parent);

    /// Shows the window's snapshot.
    void follow();
    /// The dialog stays open then: closing it would end the tool.
    bool isToolOpen() const noexcept
    {
        return tool_.isOpen();
    }
    void reject() override;
    /// Whether the versions of the selected file are shown.
    bool hasSides() const noexcept
    {
        return !shown_.string().empty();
    }

  private:
    enum Pane
    {
        Ancestor,
        Ours,
        Theirs,
        WorkingCopy,
        PaneCount
    };
    void makePanes(QGridLayout &grid);
    /// Empty if none is selected.
    upath selected() const;
    void readSelected();
    void showSides(const upath &file, const Sides &sides);
    void openTool();
    void markResolved();

    Context context_;
    std::vector<upath> files_;
    upath shown_;
    Sides sides_;
    MergeTool tool_;
    QListWidget *list_;
    std::array<QPlainTextEdit *, PaneCount> panes_{};
    QPushButton *toolButton_;
    QPushButton *resolved_;
    QPushButton *conclude_;
};

} // namespace vclink::desktop
