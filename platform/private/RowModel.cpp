#include "platform/private/RowModel.h"

#include <algorithm>

#include "platform/ListView.h"
#include "platform/private/ListPeer.h"

BListItem* RowModel::At(int32 index) const {
    return index >= 0 && index < Count() ? rows_[static_cast<std::size_t>(index)] : nullptr;
}

int32 RowModel::IndexOf(const BListItem* row) const {
    const auto found = std::find(rows_.begin(), rows_.end(), row);
    return found == rows_.end() ? -1 : static_cast<int32>(found - rows_.begin());
}

void RowModel::Insert(int32 index, const std::vector<BListItem*>& rows) {
    beginInsertRows(QModelIndex(), index, index + static_cast<int32>(rows.size()) - 1);
    rows_.insert(rows_.begin() + index, rows.begin(), rows.end());
    endInsertRows();
}

void RowModel::Remove(int32 index, int32 count) {
    beginRemoveRows(QModelIndex(), index, index + count - 1);
    rows_.erase(rows_.begin() + index, rows_.begin() + index + count);
    endRemoveRows();
}

void RowModel::Replace(std::vector<BListItem*> rows) {
    beginResetModel();
    rows_ = std::move(rows);
    endResetModel();
}

void RowModel::Reorder(std::vector<BListItem*> order) {
    emit layoutAboutToBeChanged({}, QAbstractItemModel::VerticalSortHint);
    rows_.swap(order);
    const QModelIndexList held = persistentIndexList();
    QModelIndexList moved;
    for (const QModelIndex& place : held)
        moved.push_back(index(IndexOf(order[static_cast<std::size_t>(place.row())])));
    changePersistentIndexList(held, moved);
    emit layoutChanged({}, QAbstractItemModel::VerticalSortHint);
}

int RowModel::rowCount(const QModelIndex& parent) const {
    return parent.isValid() ? 0 : Count();
}

QVariant RowModel::data(const QModelIndex& index, int role) const {
    const BListItem* row = index.isValid() ? At(index.row()) : nullptr;
    if (row && role == Qt::AccessibleTextRole)
        return QString::fromStdString(row->AccessibleText());
    if (row && role == Qt::DisplayRole)
        return QString::fromStdString(row->SearchText());
    return {};
}
