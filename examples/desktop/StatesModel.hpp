// SPDX-License-Identifier: MIT
#pragma once

#include <vector>

#include <QAbstractTableModel>
#include <QSortFilterProxyModel>

#include "vclink/FileStateMap.hpp"

namespace vclink::desktop
{

/// The files of a working copy with their states, one in each row.
class StatesModel : public QAbstractTableModel
{
  public:
    enum Column
    {
        StateColumn,
        NameColumn,
        ColumnCount
    };

    using QAbstractTableModel::QAbstractTableModel;

    void setStates(const upath &root, const FileStateMap &states);
    /// After a change of the language.
    void retranslate();
    const upath &pathAt(int row) const;
    FileState stateAt(int row) const;

    int rowCount(const QModelIndex &parent = {}) const override;
    int columnCount(const QModelIndex &parent = {}) const override;
    QVariant data(const QModelIndex &index, int role) const override;
    QVariant headerData(int section, Qt::Orientation orientation, int role) const override;

  private:
    struct Row
    {
        upath path;
        QString name;
        FileState state;
    };
    std::vector<Row> rows_;
};

/// The part of the files that is shown, in the order of a column.
class StatesFilter : public QSortFilterProxyModel
{
  public:
    using QSortFilterProxyModel::QSortFilterProxyModel;

    void setShowsClean(bool shows);

  protected:
    bool filterAcceptsRow(int row, const QModelIndex &parent) const override;

  private:
    bool showsClean_ = false;
};

} // namespace vclink::desktop
