// The toolkit's view of a list's rows. Only for the layer's own sources.
#pragma once

#include <QAbstractListModel>

#include "platform/private/RowStore.h"

// Owns the order of the rows and announces its changes; the rows themselves are borrowed. What a row says to
// assistive technology, which is also what typed letters search, is asked of the row when wanted. Belongs to
// its list; interface thread.
class RowModel : public QAbstractListModel {
    Q_DISABLE_COPY_MOVE(RowModel)

  public:
    RowModel() = default;

    [[nodiscard]] int32 Count() const { return rows_.Count(); }
    // Null when the index lies outside.
    [[nodiscard]] BListItem* At(int32 index) const;
    [[nodiscard]] std::vector<BListItem*> Rows() const { return rows_.Rows(); }

    void Insert(int32 index, const std::vector<BListItem*>& rows);
    void Remove(int32 index, int32 count);
    void Clear();
    // order holds the same rows. What the toolkit holds on to stays with its row.
    void Reorder(std::vector<BListItem*> order);
    // Lets go of every place that the toolkit holds on to. Its table of them grows with a scattered
    // selection, never shrinks by itself, and is gone through at every change.
    void ForgetHeldPlaces();

    [[nodiscard]] int rowCount(const QModelIndex& parent) const override;
    [[nodiscard]] QVariant data(const QModelIndex& index, int role) const override;

  private:
    RowStore rows_;
};
