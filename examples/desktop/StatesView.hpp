// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <vector>

#include <QComboBox>
#include <QLineEdit>
#include <QTreeView>
#include <QWidget>

#include "StatesModel.hpp"

namespace vclink::desktop
{

struct Snapshot;

/// The list of files, with its filters and its selection.
class StatesView : public QWidget
{
  public:
    /// @param selected called when other files are selected
    StatesView(std::function<void()> selected, QWidget *parent);

    /// Keeps the selection.
    void display(const Snapshot &snapshot);
    std::vector<upath> selection() const;
    void select(const std::vector<upath> &files);
    void retranslate();

  private:
    StatesModel model_;
    StatesFilter filter_;
    QLineEdit *name_;
    QComboBox *shown_;
    QTreeView *list_;
};

} // namespace vclink::desktop
