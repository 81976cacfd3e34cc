#pragma once

#include <functional>
#include <memory>
#include <vector>

#include "ColumnListView/CLVColumn.h"
#include "ColumnListView/CLVListItem.h"
#include "ColumnListView/ColumnGeometry.h"
#include "ColumnListView/OutlineRows.h"
#include "platform/Bitmap.h"
#include "platform/ListView.h"
#include "platform/ScrollView.h"

class CLVColumnLabelView;
class ColumnListView;

// The container of a ColumnListView: the header above the rows, the scroll bars beside them. The bars follow
// the list's rows and columns by themselves; the list moves the header along sideways. It has no knowledge of
// columns. Owns the list and the header; belongs to the view it is added to. Interface thread.
class BetterScrollView : public BScrollView {
  public:
    // Takes ownership of list and header. Made by the list's constructor only.
    BetterScrollView(const char* name, ColumnListView* list, CLVColumnLabelView* header, uint32 resizingMode,
                     uint32 flags, bool horizontal, bool vertical, border_style border);
};

// A bitmap that is filled from a table of pixels as it is made, for pictures that are part of the program.
class PrefilledBitmap : public BBitmap {
  public:
    // data: length bytes of pixels, rows top to bottom without padding, in the given colour space. Pixels
    // that the table does not reach keep the colour space's first content.
    PrefilledBitmap(BRect bounds, color_space space, const void* data, int32 length)
        : BBitmap(bounds, space) {
        SetBits(data, length, 0, space);
    }
};

// A list of rows in columns, under a header in which the person resizes, reorders and sorts the columns. It
// places the columns and keeps them, their order and the sort keys; rows draw themselves, one column at a
// time. It does not delete rows, does not save widths, and sends its window nothing of its own: selection and
// invocation are the base's.
//
// A column's index, wherever one is asked for or given, is its place in the order of adding, which
// reordering on the screen does not change.
//
// A hierarchical list also is an outline: its full list holds every row, each followed by the rows below it,
// which have higher levels; the base's rows are those in sight, whose superitems are all expanded. Indexes of
// AddItem, AddList, RemoveItem and RemoveItems are then places in the full list, and a row takes the rows
// below it along when it is removed. In a flat list the full list is the list itself.
//
// The list belongs to its container, as does the header; the container belongs to the view it is added to.
// Interface thread; everything that changes the list wants the window's lock once there is a window. A call
// without it is a programming error: a build with assertions reports it and ends.
class ColumnListView : public BListView {
  public:
    using SortFunction = int (*)(const CLVListItem* a, const CLVListItem* b, int32 column);

    // Makes the list, its header and its container, and stores the container, which is what the caller adds
    // to a window (or deletes). frame is that of rows and header together; the scroll bars come to its right
    // and below it. font (null: the plain font) is the header's, and the rows' until SetFont. The toolkit
    // fills the corner between two scroll bars itself, whatever scrollViewCorner says.
    ColumnListView(BRect frame, BetterScrollView** container, const char* name, uint32 resizingMode,
                   uint32 flags, list_view_type type, bool hierarchical, bool horizontalScrollBar,
                   bool verticalScrollBar, bool scrollViewCorner, border_style border, const BFont* font);
    // Deletes the columns, last first; rows stay their owner's.
    ~ColumnListView() override;

    // --- rows ---
    // Rows must be CLVListItems that are in no list; false otherwise, and then nothing is added.
    bool AddItem(BListItem* item) override;
    bool AddItem(BListItem* item, int32 index) override;
    bool AddList(BList* newItems) override;
    bool AddList(BList* newItems, int32 index) override;
    bool RemoveItem(BListItem* item) override;
    BListItem* RemoveItem(int32 index) override;
    bool RemoveItems(int32 index, int32 count) override;
    void RemoveSelected() override;
    void MakeEmpty() override;

    void MouseDown(BPoint where) override;
    void FrameResized(float width, float height) override;
    void ScrollTo(BPoint where) override;

    // --- columns ---
    // Takes ownership and shows the column behind the others (but before those that keep last). False, and
    // nothing changes, for null, a column that is in a list, and an expander column when the list is not
    // hierarchical or has one.
    virtual bool AddColumn(CLVColumn* column);
    // The same for all columns of the list (CLVColumn pointers), or for none.
    virtual bool AddColumnList(BList* newColumns);
    // Gives the column back to the caller; false when it is not in this list.
    virtual bool RemoveColumn(CLVColumn* column);
    // The same for count columns from first on, by index; false, and nothing changes, when there are fewer.
    virtual bool RemoveColumns(CLVColumn* first, int32 count);
    // Shows the columns in this order: order holds every column's index once, from left to right. Columns
    // that keep first or last are moved to their side. False when order is no such thing.
    virtual bool SetDisplayOrder(const int32* order);

    // Called when the width of a shown column or the display order has changed: redraw what moved and tell
    // the rows. An override calls the base's.
    virtual void ColumnWidthChanged(int32 column, float width);
    virtual void DisplayOrderChanged(const int32* order);

    // --- sorting ---
    // Makes the column the only key (mode none becomes ascending) and sorts, unless it is the primary key
    // already. A negative index removes all keys; an index without column, or of one that is not sortable,
    // is ignored.
    virtual void SetSortKey(int32 column);
    // Appends a sortable column that is no key yet as the last key, and sorts.
    virtual void AddSortKey(int32 column);
    // Sets the mode of a sortable column whose mode differs, and sorts; a key set to none stops being one,
    // and a column that is no key does not become one.
    virtual void SetSortMode(int32 column, CLVSortMode mode);
    // Called when keys or modes have changed, after sorting. The base does nothing.
    virtual void SortingChanged() {}

    // --- outline; for hierarchical lists ---
    // Adds item directly behind superitem's last descendant, one level below superitem. False in a flat list
    // and when superitem is not in this one.
    virtual bool AddUnder(BListItem* item, BListItem* superitem);
    // Show or hide the rows below item; those below a collapsed row of them stay hidden. A row that is not
    // in this list is left alone.
    virtual void Expand(CLVListItem* item);
    virtual void Collapse(CLVListItem* item);

    // Null when the index lies outside.
    [[nodiscard]] CLVColumn* ColumnAt(int32 index) const;
    // -1 when the column is not in this list.
    [[nodiscard]] int32 IndexOfColumn(const CLVColumn* column) const;
    [[nodiscard]] int32 CountColumns() const { return static_cast<int32>(columns_.size()); }
    // The columns' indexes from left to right, hidden ones included.
    [[nodiscard]] std::vector<int32> DisplayOrder() const;

    // Compares two rows by one column, as strcmp does; null (as at first) for no sorting. Takes effect with
    // the next sort. It is called for every comparison and should be cheap.
    void SetSortFunction(SortFunction function) { sortFunction_ = function; }
    // Ascending to descending to none to ascending.
    void ReverseSortMode(int32 column);
    // Replaces all keys by count columns with their modes, primary first, and sorts once. What is no column,
    // not sortable, named before or of mode none is left out.
    void SetSorting(int32 count, const int32* columns, const CLVSortMode* modes);
    // Stores the keys and their modes, primary first, and returns how many there are: at most CountColumns().
    // Either array may be null.
    int32 Sorting(int32* columns, CLVSortMode* modes) const;
    [[nodiscard]] bool IsSortKey(int32 column) const;
    // The index of the first key; -1 when there is none.
    [[nodiscard]] int32 PrimarySortKey() const;
    // Sorts by the keys as they stand; equal rows keep their order, the selection stays with its rows.
    void SortItems();

    [[nodiscard]] bool IsHierarchical() const { return hierarchical_; }
    [[nodiscard]] bool IsExpanded(int32 fullIndex) const;
    // The row that item stands under, or null.
    [[nodiscard]] CLVListItem* Superitem(const CLVListItem* item) const;

    // The full list; -1 or null where there is no such row.
    [[nodiscard]] int32 FullListCountItems() const;
    [[nodiscard]] bool FullListIsEmpty() const { return FullListCountItems() == 0; }
    [[nodiscard]] int32 FullListIndexOf(const CLVListItem* item) const;
    [[nodiscard]] CLVListItem* FullListItemAt(int32 fullIndex) const;
    [[nodiscard]] CLVListItem* FullListFirstItem() const { return FullListItemAt(0); }
    [[nodiscard]] CLVListItem* FullListLastItem() const { return FullListItemAt(FullListCountItems() - 1); }
    // The place in the full list of the index-th selected row.
    [[nodiscard]] int32 FullListCurrentSelection(int32 index = 0) const;
    // Calls visit for one row after the other until it returns true. visit must not add or remove rows.
    void FullListDoForEach(const std::function<bool(CLVListItem*)>& visit) const;

    // --- for the header and the rows ---
    [[nodiscard]] const std::vector<CLVColumn*>& ColumnsInDisplayOrder() const { return displayOrder_; }
    [[nodiscard]] const std::vector<DragGroup>& DragGroups() const { return dragGroups_; }
    [[nodiscard]] HeaderHit HitTestHeader(float x) const;
    // Scrolls sideways, no further than needed, until the shown column is seen.
    void ScrollToColumn(const CLVColumn& column);
    // Moves a drag group to the other side of another: see MoveGroup.
    void MoveDragGroup(int32 dragged, int32 target);
    // The right edge of the last shown column; -1 when none is shown.
    [[nodiscard]] float ColumnsEnd() const { return layout_.end; }
    // A column's part of a row's rectangle, with the indentation.
    [[nodiscard]] BRect ColumnFrame(const CLVListItem& row, const CLVColumn& column,
                                    const BRect& rowRect) const;
    // The index of the shown expander column, or -1.
    [[nodiscard]] int32 ExpanderColumn() const;
    [[nodiscard]] const BBitmap* Arrow(bool expanded) const { return expanded ? &downArrow_ : &rightArrow_; }
    [[nodiscard]] CLVColumnLabelView* Header() const { return header_; }

  private:
    friend class CLVColumn;

    void AssertLocked() const;

    [[nodiscard]] bool TakesColumns(const std::vector<CLVColumn*>& added) const;
    bool AddColumns(const std::vector<CLVColumn*>& added);
    void ReleaseColumn(std::size_t index);
    void NumberColumns();
    [[nodiscard]] std::vector<ColumnShape> Shapes() const;
    void KeepOrder();
    void PlaceColumns();
    // Columns came, went, were shown or hidden.
    void ColumnsChanged();
    // A shown column has another width.
    void ColumnResized(CLVColumn& column);
    void TellRowsOfFrames(float from);

    [[nodiscard]] CLVColumn* SortableColumn(int32 column) const;
    void MakeKey(CLVColumn* column);
    // The keys or modes are others now.
    void SortBy();
    [[nodiscard]] int Compare(const CLVListItem* a, const CLVListItem* b) const;

    void AddToOutline(const OutlineSequence& rows, int32 index);
    static void ReleaseRow(CLVListItem& row);
    void ReleaseAllRows();
    // Take the rows of this part of the full list out of the base's, and put in those to be seen.
    void HideRows(int32 fullBegin, int32 fullEnd);
    void ShowRows(int32 fullBegin, int32 fullEnd);
    void UpdateSight();
    void SetExpanded(CLVListItem* item, bool expanded);

    std::vector<std::unique_ptr<CLVColumn>> columns_; // in the order of adding
    std::vector<CLVColumn*> displayOrder_;
    std::vector<CLVColumn*> sortKeys_; // primary first; never of mode none
    ColumnLayout layout_;              // of displayOrder_
    std::vector<DragGroup> dragGroups_;
    OutlineSequence fullList_; // hierarchical lists only
    bool hierarchical_;
    SortFunction sortFunction_ = nullptr;
    PrefilledBitmap rightArrow_;
    PrefilledBitmap downArrow_;
    CLVColumnLabelView* header_; // the container's
};
