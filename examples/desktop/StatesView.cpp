// SPDX-License-Identifier: MIT
#include "StatesView.hpp"

#include <unordered_set>
#include <utility>

#include <QHBoxLayout>
#include <QHeaderView>
#include <QVBoxLayout>

#include "Snapshot.hpp"
#include "hostTools.hpp"
#include "language.hpp"
#include "owned.hpp"

namespace vclink::desktop
{

StatesView::StatesView(std::function<void()> selected, QWidget *parent)
    : QWidget(parent), name_(makeOwned<QLineEdit>(this)), shown_(makeOwned<QComboBox>(this)),
      list_(makeOwned<QTreeView>(this))
{
    name_->setObjectName(QStringLiteral("filter"));
    name_->setClearButtonEnabled(true);
    shown_->setObjectName(QStringLiteral("shown"));
    shown_->addItems({QString(), QString()});
    filter_.setSourceModel(&model_);
    filter_.setFilterKeyColumn(StatesModel::NameColumn);
    filter_.setFilterCaseSensitivity(Qt::CaseInsensitive);
    list_->setObjectName(QStringLiteral("files"));
    list_->setModel(&filter_);
    list_->setRootIsDecorated(false);
    list_->setUniformRowHeights(true);
    list_->setSelectionMode(QAbstractItemView::ExtendedSelection);
    list_->setSortingEnabled(true);
    list_->sortByColumn(StatesModel::NameColumn, Qt::AscendingOrder);
    list_->setColumnWidth(StatesModel::StateColumn, fontMetrics().averageCharWidth() * 24);

    auto *const rows = makeOwned<QVBoxLayout>(this);
    rows->setContentsMargins({});
    auto *const above = makeOwned<QHBoxLayout>(static_cast<QWidget *>(nullptr));
    above->addWidget(name_);
    above->addWidget(shown_);
    rows->addLayout(above);
    rows->addWidget(list_);

    connect(name_, &QLineEdit::textChanged, &filter_, &StatesFilter::setFilterFixedString);
    connect(shown_, &QComboBox::currentIndexChanged, this,
            [this](int index) { filter_.setShowsClean(index == 1); });
    connect(list_->selectionModel(), &QItemSelectionModel::selectionChanged, this,
            std::move(selected));
    retranslate();
}

void StatesView::display(const Snapshot &snapshot)
{
    const auto selected = selection();
    model_.setStates(snapshot.root, snapshot.states);
    select(selected);
}

std::vector<upath> StatesView::selection() const
{
    std::vector<upath> files;
    for (const auto &index : list_->selectionModel()->selectedRows())
        files.push_back(model_.pathAt(filter_.mapToSource(index).row()));
    return files;
}

void StatesView::select(const std::vector<upath> &files)
{
    const std::unordered_set<upath, host_tools::PathHash> wanted(files.begin(), files.end());
    QItemSelection rows;
    for (int row = 0; !wanted.empty() && row < filter_.rowCount(); ++row)
    {
        const QModelIndex index = filter_.index(row, 0);
        if (wanted.count(model_.pathAt(filter_.mapToSource(index).row())) != 0)
            rows.select(index, index);
    }
    list_->selectionModel()->select(rows, QItemSelectionModel::ClearAndSelect |
                                              QItemSelectionModel::Rows);
}

void StatesView::retranslate()
{
    const auto selected = selection();
    name_->setPlaceholderText(say("Filter names"));
    shown_->setItemText(0, say("All changes"));
    shown_->setItemText(1, say("All files"));
    model_.retranslate();
    select(selected);
}

} // namespace vclink::desktop
