#include "platform/private/RowModel.h"

#include "platform/ListView.h"
#include "platform/private/ListPeer.h"

BListItem* RowModel::At(int32 index) const {
    return index >= 0 && index < rows_.Count() ? rows_.At(index) : nullptr;
}

void RowModel::Insert(int32 index, const std::vector<BListItem*>& rows) {
    beginInsertRows(QModelIndex(), index, index + static_cast<int32>(rows.size()) - 1);
    rows_.Insert(index, rows);
    endInsertRows();
}

void RowModel::Remove(int32 index, int32 count) {
    beginRemoveRows(QModelIndex(), index, index + count - 1);
    rows_.Remove(index, count);
    endRemoveRows();
}

void RowModel::Clear() {
    beginResetModel();
    rows_.Clear();
    endResetModel();
}

void RowModel::Reorder(std::vector<BListItem*> order) {
    emit layoutAboutToBeChanged({}, QAbstractItemModel::VerticalSortHint);
    const QModelIndexList held = persistentIndexList();
    std::vector<const BListItem*> heldRows;
    for (const QModelIndex& index : held)
        heldRows.push_back(rows_.At(index.row()));
    rows_.Assign(std::move(order));
    for (int32 index = 0; index < rows_.Count(); index++)
        ListAccess::SetIndex(*rows_.At(index), index);
    QModelIndexList moved;
    for (const BListItem* row : heldRows)
        moved.push_back(index(ListAccess::Index(*row)));
    changePersistentIndexList(held, moved);
    emit layoutChanged({}, QAbstractItemModel::VerticalSortHint);
}

// To reset unheard: the rows have not changed for anyone.
void RowModel::ForgetHeldPlaces() {
    const QSignalBlocker silent(this);
    beginResetModel();
    endResetModel();
}

int RowModel::rowCount(const QModelIndex& parent) const {
    return parent.isValid() ? 0 : rows_.Count();
}

QVariant RowModel::data(const QModelIndex& index, int role) const {
    const BListItem* row = index.isValid() ? At(index.row()) : nullptr;
    if (row && role == Qt::AccessibleTextRole)
        return QString::fromStdString(row->AccessibleText());
    if (row && role == Qt::DisplayRole)
        return QString::fromStdString(row->SearchText());
    return {};
}
