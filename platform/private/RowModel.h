#pragma once

// The toolkit's view of a list's rows. Only for the layer's own sources.

#include <vector>

#include <QAbstractListModel>

#include "platform/Types.h"

class BListItem;

// Owns the order of the rows and announces its changes; the rows themselves are borrowed. What a row says to
// assistive technology, which is also what typed letters search, is asked of the row when wanted. Belongs to
// its list; interface thread.
class RowModel : public QAbstractListModel {
    Q_DISABLE_COPY_MOVE(RowModel)

  public:
    RowModel() = default;

    [[nodiscard]] int32 Count() const { return static_cast<int32>(rows_.size()); }
    // Null when the index lies outside.
    [[nodiscard]] BListItem* At(int32 index) const;
    // -1 when the row is not here.
    [[nodiscard]] int32 IndexOf(const BListItem* row) const;
    [[nodiscard]] const std::vector<BListItem*>& Rows() const { return rows_; }

    void Insert(int32 index, const std::vector<BListItem*>& rows);
    void Remove(int32 index, int32 count);
    // These rows instead of all; the toolkit lets go of what it holds on to.
    void Replace(std::vector<BListItem*> rows);
    // order holds the same rows. What the toolkit holds on to stays with its row.
    void Reorder(std::vector<BListItem*> order);

    [[nodiscard]] int rowCount(const QModelIndex& parent) const override;
    [[nodiscard]] QVariant data(const QModelIndex& index, int role) const override;

  private:
    std::vector<BListItem*> rows_;
};
