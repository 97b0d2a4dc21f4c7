// SPDX-License-Identifier: MIT
#include "StatesModel.hpp"

#include <array>

#include <QColor>
#include <QIcon>
#include <QPainter>
#include <QPixmap>

#include "hostTools.hpp"
#include "language.hpp"
#include "text.hpp"

namespace vclink::desktop
{
namespace
{

struct Look
{
    char letter;
    QRgb colour;
};

/// In the order of FileState's numbers.
constexpr std::array<Look, 8> looks{{{'?', 0x6a737d},
                                     {' ', 0x586069},
                                     {'~', 0x0366d6},
                                     {'!', 0xb31d28},
                                     {'M', 0x8a6100},
                                     {'A', 0x1a7f37},
                                     {'D', 0xa04100},
                                     {'-', 0x6f42c1}}};

const Look &lookOf(FileState state)
{
    const auto number = static_cast<std::size_t>(state.getState());
    return looks[number < looks.size() ? number : std::size_t{FileState::Unknown}];
}

QIcon makeIcon(const Look &look)
{
    QPixmap picture(16, 16);
    picture.fill(Qt::transparent);
    QPainter painter(&picture);
    painter.setRenderHint(QPainter::Antialiasing);
    painter.setPen(Qt::NoPen);
    painter.setBrush(QColor(look.colour));
    painter.drawRoundedRect(picture.rect().adjusted(1, 1, -1, -1), 4, 4);
    painter.setPen(Qt::white);
    QFont font = painter.font();
    font.setPixelSize(11);
    font.setBold(true);
    painter.setFont(font);
    painter.drawText(picture.rect(), Qt::AlignCenter, QChar::fromLatin1(look.letter));
    return picture;
}

} // namespace

void StatesModel::setStates(const upath &root, const FileStateMap &states)
{
    beginResetModel();
    rows_.clear();
    rows_.reserve(states.size());
    for (const auto &[path, state] : states)
        rows_.push_back({path, printable(host_tools::relativeName(path, root)), state});
    endResetModel();
}

void StatesModel::retranslate()
{
    beginResetModel();
    endResetModel();
}

const upath &StatesModel::pathAt(int row) const
{
    return rows_.at(static_cast<std::size_t>(row)).path;
}

FileState StatesModel::stateAt(int row) const
{
    return rows_.at(static_cast<std::size_t>(row)).state;
}

int StatesModel::rowCount(const QModelIndex &parent) const
{
    return parent.isValid() ? 0 : static_cast<int>(rows_.size());
}

int StatesModel::columnCount(const QModelIndex &parent) const
{
    return parent.isValid() ? 0 : ColumnCount;
}

QVariant StatesModel::data(const QModelIndex &index, int role) const
{
    const Row &row = rows_.at(static_cast<std::size_t>(index.row()));
    const bool isState = index.column() == StateColumn;
    if (role == Qt::DisplayRole)
        return isState ? say(host_tools::nameOf(row.state)) : row.name;
    if (role == Qt::ForegroundRole && isState)
        return QColor(lookOf(row.state).colour);
    if (role == Qt::DecorationRole && isState)
        return makeIcon(lookOf(row.state));
    return {};
}

QVariant StatesModel::headerData(int section, Qt::Orientation orientation, int role) const
{
    if (orientation != Qt::Horizontal || role != Qt::DisplayRole)
        return {};
    return say(section == StateColumn ? "State" : "Name");
}

void StatesFilter::setShowsClean(bool shows)
{
    showsClean_ = shows;
    invalidateFilter();
}

bool StatesFilter::filterAcceptsRow(int row, const QModelIndex &parent) const
{
    const auto &model = static_cast<const StatesModel &>(*sourceModel());
    return (showsClean_ || model.stateAt(row).getState() != FileState::Clean) &&
           QSortFilterProxyModel::filterAcceptsRow(row, parent);
}

} // namespace vclink::desktop
