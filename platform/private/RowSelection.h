#pragma once

// Which rows of a list are selected. Only for the layer's own sources.

#include <QItemSelectionModel>

#include "platform/ListView.h"

class RowModel;
class RowsWidget;

// The rows' own marks say what is selected; the toolkit's selection follows them, and sets them when a person
// selects. While rows come, go and change places the two are apart: the toolkit keeps a scattered selection
// as thousands of positions that each change would have to move, so it is emptied before the change and
// filled again from the marks before anything uses it. Belongs to its list; interface thread.
class RowSelection {
  public:
    RowSelection(RowModel& model, RowsWidget& view);
    RowSelection(const RowSelection&) = delete;
    RowSelection& operator=(const RowSelection&) = delete;

    // The index of the nth selected row from the top, or -1.
    [[nodiscard]] int32 Nth(int32 n) const;

    // Rows from first to last, both inside.
    void Select(int32 first, int32 last, bool extend);
    void Clear();

    // The index of the row that keys go on from, or -1.
    [[nodiscard]] int32 Current() const;
    void SetCurrent(int32 index);

    // To be called before rows change.
    void Detach();
    // Brings the toolkit's selection and current row in line again; nothing when it is.
    void Attach();
    void RemoveSelected();
    // To be called when rows have been taken out, with what they were; after Detach. They leave the list.
    void RowsRemoved(int32 index, const std::vector<BListItem*>& rows);

  private:
    void Mark(const QItemSelection& ranges, bool selected);

    RowModel& model_;
    RowsWidget& view_;
    bool attached_ = true;
    BListItem* current_ = nullptr; // while not attached
};
