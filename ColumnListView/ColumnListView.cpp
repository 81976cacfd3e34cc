#include "ColumnListView/ColumnListView.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>

#include "ColumnListView/CLVColumnLabelView.h"
#include "platform/Window.h"

namespace {

constexpr uint8 X = 0;                         // black in the system's colour map
constexpr uint8 o = B_TRANSPARENT_MAGIC_CMAP8; // what lies below stays

// clang-format off
constexpr uint8 RightArrow[] = {
    o, o, o, o, o, o, o, o, o, o,
    o, o, o, X, o, o, o, o, o, o,
    o, o, o, X, X, o, o, o, o, o,
    o, o, o, X, X, X, o, o, o, o,
    o, o, o, X, X, X, X, o, o, o,
    o, o, o, X, X, X, X, o, o, o,
    o, o, o, X, X, X, o, o, o, o,
    o, o, o, X, X, o, o, o, o, o,
    o, o, o, X, o, o, o, o, o, o,
    o, o, o, o, o, o, o, o, o, o,
};
constexpr uint8 DownArrow[] = {
    o, o, o, o, o, o, o, o, o, o,
    o, o, o, o, o, o, o, o, o, o,
    o, o, o, o, o, o, o, o, o, o,
    o, X, X, X, X, X, X, X, X, o,
    o, o, X, X, X, X, X, X, o, o,
    o, o, o, X, X, X, X, o, o, o,
    o, o, o, o, X, X, o, o, o, o,
    o, o, o, o, o, o, o, o, o, o,
    o, o, o, o, o, o, o, o, o, o,
    o, o, o, o, o, o, o, o, o, o,
};
// clang-format on

BRect ArrowBounds() {
    return {0, 0, ArrowSize - 1, ArrowSize - 1};
}

CLVListItem* Row(BListItem* item) {
    return static_cast<CLVListItem*>(item); // every row of the list was checked as it was added
}

template <class T>
void Erase(std::vector<T>& values, const T& value) {
    values.erase(std::remove(values.begin(), values.end(), value), values.end());
}

} // namespace

BetterScrollView::BetterScrollView(const char* name, ColumnListView* list, CLVColumnLabelView* header,
                                   uint32 resizingMode, uint32 flags, bool horizontal, bool vertical,
                                   border_style border)
    : BScrollView(name, list, resizingMode, flags, horizontal, vertical, border) {
    const float height = header->Frame().Height();
    SetTopMargin(height + 1);
    const BRect rows = list->Frame();
    header->MoveTo(rows.left, rows.top - height - 1);
    header->ResizeTo(Bounds().Width() - 2 * rows.left, height);
    AddChild(header);
}

ColumnListView::ColumnListView(BRect frame, BetterScrollView** container, const char* name,
                               uint32 resizingMode, uint32 flags, list_view_type type, bool hierarchical,
                               bool horizontalScrollBar, bool verticalScrollBar, bool, border_style border,
                               const BFont* font)
    : BListView(frame, name, type, resizingMode, flags),
      hierarchical_(hierarchical),
      rightArrow_(ArrowBounds(), B_CMAP8, RightArrow, sizeof RightArrow),
      downArrow_(ArrowBounds(), B_CMAP8, DownArrow, sizeof DownArrow) {
    const BFont& labelFont = font ? *font : *be_plain_font;
    const BRect headerFrame(0, 0, frame.Width(), CLVColumnLabelView::HeightFor(labelFont));
    header_ = new CLVColumnLabelView(headerFrame, this, &labelFont);
    BListView::SetFont(&labelFont);
    *container = new BetterScrollView(nullptr, this, header_, resizingMode, B_WILL_DRAW | B_FRAME_EVENTS,
                                      horizontalScrollBar, verticalScrollBar, border);
}

ColumnListView::~ColumnListView() {
    ReleaseAllRows();
    while (!columns_.empty())
        columns_.pop_back();
}

void ColumnListView::AssertLocked() const {
#ifndef NDEBUG
    const BLooper* looper = Looper();
    if (looper && !looper->IsLocked()) {
        std::fputs("The looper must be locked.\n", stderr);
        std::abort();
    }
#endif
}

// --- columns ---

bool ColumnListView::AddColumn(CLVColumn* column) {
    return AddColumns({column});
}

bool ColumnListView::AddColumnList(BList* newColumns) {
    std::vector<CLVColumn*> added;
    for (int32 i = 0; newColumns && i < newColumns->CountItems(); ++i)
        added.push_back(static_cast<CLVColumn*>(newColumns->ItemAt(i)));
    return newColumns && AddColumns(added);
}

bool ColumnListView::TakesColumns(const std::vector<CLVColumn*>& added) const {
    const auto isExpander = [](const auto& column) { return (column->Flags() & CLVF_EXPANDER) != 0; };
    for (std::size_t i = 0; i < added.size(); ++i) {
        const auto end = added.begin() + static_cast<std::ptrdiff_t>(i);
        if (!added[i] || added[i]->list_ || std::find(added.begin(), end, added[i]) != end)
            return false;
    }
    const auto expanders = std::count_if(added.begin(), added.end(), isExpander);
    return expanders == 0 ||
           (hierarchical_ && expanders + std::count_if(columns_.begin(), columns_.end(), isExpander) == 1);
}

bool ColumnListView::AddColumns(const std::vector<CLVColumn*>& added) {
    AssertLocked();
    if (!TakesColumns(added))
        return false;
    for (CLVColumn* column : added) {
        columns_.emplace_back(column);
        displayOrder_.push_back(column);
        column->list_ = this;
    }
    NumberColumns();
    KeepOrder();
    ColumnsChanged();
    return true;
}

bool ColumnListView::RemoveColumn(CLVColumn* column) {
    return RemoveColumns(column, 1);
}

bool ColumnListView::RemoveColumns(CLVColumn* first, int32 count) {
    AssertLocked();
    const int32 index = IndexOfColumn(first);
    if (index < 0 || count < 1 || count > CountColumns() - index)
        return false;
    const std::size_t keys = sortKeys_.size();
    for (int32 i = 0; i < count; ++i)
        ReleaseColumn(static_cast<std::size_t>(index));
    NumberColumns();
    ColumnsChanged();
    if (sortKeys_.size() != keys)
        SortingChanged();
    return true;
}

void ColumnListView::ReleaseColumn(std::size_t index) {
    CLVColumn* column = columns_[index].release();
    columns_.erase(columns_.begin() + static_cast<std::ptrdiff_t>(index));
    Erase(displayOrder_, column);
    Erase(sortKeys_, column);
    column->list_ = nullptr;
    column->index_ = -1;
    column->pushed_ = false;
}

void ColumnListView::NumberColumns() {
    for (std::size_t i = 0; i < columns_.size(); ++i)
        columns_[i]->index_ = static_cast<int32>(i);
}

CLVColumn* ColumnListView::ColumnAt(int32 index) const {
    return index >= 0 && index < CountColumns() ? columns_[static_cast<std::size_t>(index)].get() : nullptr;
}

int32 ColumnListView::IndexOfColumn(const CLVColumn* column) const {
    return column && column->list_ == this ? column->index_ : -1;
}

std::vector<int32> ColumnListView::DisplayOrder() const {
    std::vector<int32> order;
    for (const CLVColumn* column : displayOrder_)
        order.push_back(column->index_);
    return order;
}

bool ColumnListView::SetDisplayOrder(const int32* order) {
    AssertLocked();
    std::vector<CLVColumn*> ordered;
    for (int32 i = 0; order && i < CountColumns(); ++i) {
        CLVColumn* column = ColumnAt(order[i]);
        if (!column || std::find(ordered.begin(), ordered.end(), column) != ordered.end())
            return false;
        ordered.push_back(column);
    }
    if (ordered.empty())
        return false;
    displayOrder_ = std::move(ordered);
    KeepOrder();
    PlaceColumns();
    DisplayOrderChanged(DisplayOrder().data());
    return true;
}

void ColumnListView::MoveDragGroup(int32 dragged, int32 target) {
    std::vector<int32> order = DisplayOrder();
    MoveGroup(dragGroups_, dragged, target, order);
    SetDisplayOrder(order.data());
}

std::vector<ColumnShape> ColumnListView::Shapes() const {
    std::vector<ColumnShape> shapes;
    for (const CLVColumn* column : displayOrder_)
        shapes.push_back({column->width_, column->flags_});
    return shapes;
}

void ColumnListView::KeepOrder() {
    const auto rank = [](const CLVColumn* column) {
        return (column->flags_ & CLVF_KEEP_FIRST) != 0 ? 0 : (column->flags_ & CLVF_KEEP_LAST) != 0 ? 2 : 1;
    };
    std::stable_sort(displayOrder_.begin(), displayOrder_.end(),
                     [&](const CLVColumn* a, const CLVColumn* b) { return rank(a) < rank(b); });
}

void ColumnListView::PlaceColumns() {
    const std::vector<ColumnShape> shapes = Shapes();
    layout_ = LayOutColumns(shapes);
    dragGroups_ = BuildDragGroups(shapes, layout_);
    for (std::size_t i = 0; i < displayOrder_.size(); ++i) {
        displayOrder_[i]->begin_ = layout_.places[i].begin;
        displayOrder_[i]->end_ = layout_.places[i].end;
        displayOrder_[i]->pushed_ = layout_.places[i].pushed;
    }
    SetDataWidth(layout_.end + 1); // the content takes in the last column's edge
}

void ColumnListView::ColumnsChanged() {
    header_->CancelPress();
    PlaceColumns();
    BFont labelFont;
    header_->GetFont(&labelFont);
    for (CLVColumn* column : displayOrder_)
        column->Truncate(labelFont);
    header_->Invalidate();
    Invalidate();
    TellRowsOfFrames(0);
}

void ColumnListView::ColumnResized(CLVColumn& column) {
    PlaceColumns();
    BFont labelFont;
    header_->GetFont(&labelFont);
    column.Truncate(labelFont);
    ColumnWidthChanged(column.index_, column.width_);
}

void ColumnListView::ColumnWidthChanged(int32 index, float) {
    const CLVColumn* column = ColumnAt(index);
    if (!column)
        return;
    // In an outline the columns before it may reach further or less far, too.
    const BRect bounds = Bounds();
    const float from = hierarchical_ ? bounds.left : column->Begin();
    Invalidate({from, bounds.top, bounds.right, bounds.bottom});
    header_->Invalidate();
    if ((column->Flags() & CLVF_WIDTH_NOTICE) != 0)
        FullListDoForEach([&](CLVListItem* row) {
            const float width = ColumnFrame(*row, *column, BRect()).Width();
            row->ColumnWidthChanged(index, std::max(width, 0.0F), this);
            return false;
        });
    TellRowsOfFrames(column->End());
}

void ColumnListView::DisplayOrderChanged(const int32*) {
    Invalidate();
    header_->Invalidate();
    TellRowsOfFrames(0);
}

void ColumnListView::TellRowsOfFrames(float from) {
    std::vector<const CLVColumn*> noticed;
    for (const CLVColumn* column : displayOrder_)
        if (column->IsShown() && (column->flags_ & CLVF_WIDTH_NOTICE) != 0 && column->begin_ >= from)
            noticed.push_back(column);
    for (int32 i = 0; !noticed.empty() && i < CountItems(); ++i) {
        CLVListItem* row = Row(ItemAt(i));
        for (const CLVColumn* column : noticed)
            row->FrameChanged(column->index_, ColumnFrame(*row, *column, ItemFrame(i)), this);
    }
}

HeaderHit ColumnListView::HitTestHeader(float x) const {
    return HitHeader(Shapes(), layout_, x);
}

void ColumnListView::ScrollToColumn(const CLVColumn& column) {
    const BRect seen = Bounds();
    const float left = std::max(seen.left, seen.left + column.End() - seen.right);
    ScrollTo({std::min(left, column.Begin()), seen.top});
}

BRect ColumnListView::ColumnFrame(const CLVListItem& row, const CLVColumn& column,
                                  const BRect& rowRect) const {
    const bool indents = column.pushed_ || (column.flags_ & CLVF_EXPANDER) != 0;
    const float indentation = indents ? IndentPerLevel * static_cast<float>(row.OutlineLevel()) : 0;
    return ColumnFrameInRow({column.begin_, column.end_, column.pushed_}, rowRect, indentation,
                            layout_.pushEnd);
}

int32 ColumnListView::ExpanderColumn() const {
    for (const CLVColumn* column : displayOrder_)
        if (column->IsShown() && (column->flags_ & CLVF_EXPANDER) != 0)
            return column->index_;
    return -1;
}

// --- sorting ---

CLVColumn* ColumnListView::SortableColumn(int32 index) const {
    CLVColumn* column = ColumnAt(index);
    return column && (column->flags_ & CLVF_SORTABLE) != 0 ? column : nullptr;
}

void ColumnListView::MakeKey(CLVColumn* column) {
    sortKeys_.push_back(column);
    if (column->sortMode_ == CLVSortMode::None)
        column->sortMode_ = CLVSortMode::Ascending;
}

void ColumnListView::SortBy() {
    header_->Invalidate();
    SortItems();
    SortingChanged();
}

void ColumnListView::SetSortKey(int32 index) {
    AssertLocked();
    CLVColumn* column = SortableColumn(index);
    if (index >= 0 && (!column || PrimarySortKey() == index))
        return;
    sortKeys_.clear();
    if (column)
        MakeKey(column);
    SortBy();
}

void ColumnListView::AddSortKey(int32 index) {
    AssertLocked();
    CLVColumn* column = SortableColumn(index);
    if (!column || IsSortKey(index))
        return;
    MakeKey(column);
    SortBy();
}

void ColumnListView::SetSortMode(int32 index, CLVSortMode mode) {
    AssertLocked();
    CLVColumn* column = SortableColumn(index);
    if (!column || column->sortMode_ == mode)
        return;
    column->sortMode_ = mode;
    if (mode == CLVSortMode::None)
        Erase(sortKeys_, column);
    SortBy();
}

void ColumnListView::ReverseSortMode(int32 index) {
    const CLVColumn* column = ColumnAt(index);
    if (!column)
        return;
    switch (column->sortMode_) {
    case CLVSortMode::Ascending:
        return SetSortMode(index, CLVSortMode::Descending);
    case CLVSortMode::Descending:
        return SetSortMode(index, CLVSortMode::None);
    case CLVSortMode::None:
        return SetSortMode(index, CLVSortMode::Ascending);
    }
}

void ColumnListView::SetSorting(int32 count, const int32* columns, const CLVSortMode* modes) {
    AssertLocked();
    sortKeys_.clear();
    for (int32 i = 0; i < count; ++i) {
        CLVColumn* column = SortableColumn(columns[i]);
        if (!column || IsSortKey(columns[i]))
            continue;
        column->sortMode_ = modes[i];
        if (modes[i] != CLVSortMode::None)
            sortKeys_.push_back(column);
    }
    SortBy();
}

int32 ColumnListView::Sorting(int32* columns, CLVSortMode* modes) const {
    for (std::size_t i = 0; i < sortKeys_.size(); ++i) {
        if (columns)
            columns[i] = sortKeys_[i]->index_;
        if (modes)
            modes[i] = sortKeys_[i]->sortMode_;
    }
    return static_cast<int32>(sortKeys_.size());
}

bool ColumnListView::IsSortKey(int32 index) const {
    return std::find(sortKeys_.begin(), sortKeys_.end(), ColumnAt(index)) != sortKeys_.end();
}

int32 ColumnListView::PrimarySortKey() const {
    return sortKeys_.empty() ? -1 : sortKeys_.front()->index_;
}

int ColumnListView::Compare(const CLVListItem* a, const CLVListItem* b) const {
    for (const CLVColumn* key : sortKeys_) {
        const int result = sortFunction_(a, b, key->index_);
        if (result != 0)
            return (result < 0) == (key->sortMode_ == CLVSortMode::Ascending) ? -1 : 1;
    }
    return 0;
}

void ColumnListView::SortItems() {
    AssertLocked();
    if (!sortFunction_ || sortKeys_.empty())
        return;
    if (!hierarchical_) {
        BListView::SortItems([this](const BListItem* a, const BListItem* b) {
            return Compare(static_cast<const CLVListItem*>(a), static_cast<const CLVListItem*>(b));
        });
        return;
    }
    fullList_ = SortedOutline(fullList_,
                              [this](const CLVListItem* a, const CLVListItem* b) { return Compare(a, b); });
    for (std::size_t i = 0; i < fullList_.size(); ++i)
        fullList_[i]->fullIndex_ = static_cast<int32>(i);
    BListView::SortItems([](const BListItem* a, const BListItem* b) {
        return static_cast<const CLVListItem*>(a)->fullIndex_ -
               static_cast<const CLVListItem*>(b)->fullIndex_;
    });
    UpdateSight();
}

// Where levels are left out, a sort can bring a row under another one than before.
void ColumnListView::UpdateSight() {
    const OutlineSequence inSight = RowsInSight(fullList_, 0, FullListCountItems());
    auto next = inSight.begin();
    for (int32 i = 0; i < FullListCountItems(); ++i) {
        const bool seen = next != inSight.end() && *next == FullListItemAt(i);
        if (seen)
            ++next;
        if (seen && !FullListItemAt(i)->inSight_)
            ShowRows(i, i + 1);
        else if (!seen)
            HideRows(i, i + 1);
    }
}

// --- rows ---

bool ColumnListView::AddItem(BListItem* item) {
    return AddItem(item, FullListCountItems());
}

bool ColumnListView::AddItem(BListItem* item, int32 index) {
    if (!dynamic_cast<CLVListItem*>(item))
        return false;
    BList one;
    one.AddItem(item);
    return AddList(&one, index);
}

bool ColumnListView::AddList(BList* newItems) {
    return AddList(newItems, FullListCountItems());
}

bool ColumnListView::AddList(BList* newItems, int32 index) {
    AssertLocked();
    if (!newItems || index < 0 || index > FullListCountItems())
        return false;
    OutlineSequence rows;
    rows.reserve(static_cast<std::size_t>(newItems->CountItems()));
    for (int32 i = 0; i < newItems->CountItems(); ++i) {
        auto* row = static_cast<CLVListItem*>(static_cast<BListItem*>(newItems->ItemAt(i)));
        if (!row || row->list_)
            break;
        row->list_ = this;
        rows.push_back(row);
    }
    const bool allNew = static_cast<int32>(rows.size()) == newItems->CountItems();
    if (allNew && hierarchical_) {
        AddToOutline(rows, index);
        return true;
    }
    if (allNew && BListView::AddList(newItems, index))
        return true;
    for (CLVListItem* row : rows)
        ReleaseRow(*row);
    return false;
}

void ColumnListView::AddToOutline(const OutlineSequence& rows, int32 index) {
    if (rows.empty())
        return;
    // The rows behind may stand under the new ones from now on.
    fullList_.insert(fullList_.begin() + index, rows.begin(), rows.end());
    const int32 end = DescendantsEnd(fullList_, index, index + static_cast<int32>(rows.size()));
    HideRows(index, end);
    ShowRows(index, end);
}

bool ColumnListView::RemoveItem(BListItem* item) {
    const auto* row = dynamic_cast<CLVListItem*>(item);
    return RemoveItem(FullListIndexOf(row)) != nullptr;
}

BListItem* ColumnListView::RemoveItem(int32 index) {
    CLVListItem* row = FullListItemAt(index);
    return row && RemoveItems(index, 1) ? row : nullptr;
}

bool ColumnListView::RemoveItems(int32 index, int32 count) {
    AssertLocked();
    if (index < 0 || count < 1 || count > FullListCountItems() - index)
        return false;
    if (!hierarchical_) {
        for (int32 i = index; i < index + count; ++i)
            ReleaseRow(*Row(ItemAt(i)));
        return BListView::RemoveItems(index, count);
    }
    const int32 end = DescendantsEnd(fullList_, index, index + count);
    HideRows(index, end);
    std::for_each(fullList_.begin() + index, fullList_.begin() + end,
                  [](CLVListItem* row) { ReleaseRow(*row); });
    fullList_.erase(fullList_.begin() + index, fullList_.begin() + end);
    return true;
}

void ColumnListView::RemoveSelected() {
    AssertLocked();
    for (int32 i = FullListCountItems() - 1; i >= 0; --i) {
        CLVListItem* row = FullListItemAt(i);
        if (row->IsSelected() && hierarchical_)
            RemoveItems(i, 1);
        else if (row->IsSelected())
            ReleaseRow(*row);
    }
    BListView::RemoveSelected();
}

void ColumnListView::MakeEmpty() {
    AssertLocked();
    ReleaseAllRows();
    fullList_.clear();
    BListView::MakeEmpty();
}

void ColumnListView::ReleaseRow(CLVListItem& row) {
    row.list_ = nullptr;
    row.inSight_ = false;
}

void ColumnListView::ReleaseAllRows() {
    FullListDoForEach([](CLVListItem* row) {
        ReleaseRow(*row);
        return false;
    });
}

void ColumnListView::MouseDown(BPoint where) {
    CLVListItem* row = ExpanderColumn() >= 0 ? Row(ItemAt(IndexOf(where))) : nullptr;
    if (!row || !row->IsSuperItem() || !row->ExpanderArrowRect().Contains(where))
        BListView::MouseDown(where);
    else if (row->IsExpanded())
        Collapse(row);
    else
        Expand(row);
}

void ColumnListView::FrameResized(float width, float height) {
    BListView::FrameResized(width, height);
    header_->ScrollTo({Bounds().left, 0});
}

void ColumnListView::ScrollTo(BPoint where) {
    BListView::ScrollTo(where);
    header_->ScrollTo({Bounds().left, 0});
}

// --- outline ---

bool ColumnListView::AddUnder(BListItem* item, BListItem* superitem) {
    AssertLocked();
    auto* row = dynamic_cast<CLVListItem*>(item);
    auto* above = dynamic_cast<CLVListItem*>(superitem);
    const int32 index = FullListIndexOf(above);
    if (!hierarchical_ || !row || row->list_ || index < 0)
        return false;
    row->SetOutlineLevel(above->OutlineLevel() + 1);
    if (!above->IsSuperItem()) {
        above->SetSuperItem(true);
        InvalidateItem(IndexOf(above));
    }
    return AddItem(row, DescendantsEnd(fullList_, index, index + 1));
}

void ColumnListView::Expand(CLVListItem* item) {
    SetExpanded(item, true);
}

void ColumnListView::Collapse(CLVListItem* item) {
    SetExpanded(item, false);
}

void ColumnListView::SetExpanded(CLVListItem* item, bool expanded) {
    AssertLocked();
    const int32 index = FullListIndexOf(item);
    if (!hierarchical_ || index < 0 || item->IsExpanded() == expanded)
        return;
    item->BListItem::SetExpanded(expanded);
    const int32 end = DescendantsEnd(fullList_, index, index + 1);
    if (expanded)
        ShowRows(index + 1, end);
    else
        HideRows(index + 1, end);
    if (item->inSight_)
        InvalidateItem(IndexOf(item));
}

void ColumnListView::HideRows(int32 begin, int32 end) {
    int32 first = -1;
    int32 count = 0;
    for (int32 i = begin; i < end; ++i) {
        CLVListItem* row = FullListItemAt(i);
        if (!row->inSight_)
            continue;
        if (count++ == 0)
            first = IndexOf(row);
        row->inSight_ = false;
    }
    BListView::RemoveItems(first, count);
}

void ColumnListView::ShowRows(int32 begin, int32 end) {
    const auto before = std::find_if(std::make_reverse_iterator(fullList_.begin() + begin), fullList_.rend(),
                                     [](const CLVListItem* row) { return row->inSight_; });
    BList rows;
    for (CLVListItem* row : RowsInSight(fullList_, begin, end)) {
        row->inSight_ = true;
        rows.AddItem(static_cast<BListItem*>(row));
    }
    BListView::AddList(&rows, before == fullList_.rend() ? 0 : IndexOf(*before) + 1);
}

bool ColumnListView::IsExpanded(int32 fullIndex) const {
    const CLVListItem* row = FullListItemAt(fullIndex);
    return row && row->IsExpanded();
}

CLVListItem* ColumnListView::Superitem(const CLVListItem* item) const {
    const int32 index = hierarchical_ ? FullListIndexOf(item) : -1;
    return index < 0 ? nullptr : FullListItemAt(SuperitemIndex(fullList_, index));
}

int32 ColumnListView::FullListCountItems() const {
    return hierarchical_ ? static_cast<int32>(fullList_.size()) : CountItems();
}

int32 ColumnListView::FullListIndexOf(const CLVListItem* item) const {
    if (!item || item->list_ != this)
        return -1;
    if (!hierarchical_)
        return IndexOf(item);
    const auto found = std::find(fullList_.begin(), fullList_.end(), item);
    return static_cast<int32>(found - fullList_.begin());
}

CLVListItem* ColumnListView::FullListItemAt(int32 fullIndex) const {
    if (fullIndex < 0 || fullIndex >= FullListCountItems())
        return nullptr;
    return hierarchical_ ? fullList_[static_cast<std::size_t>(fullIndex)] : Row(ItemAt(fullIndex));
}

int32 ColumnListView::FullListCurrentSelection(int32 index) const {
    return FullListIndexOf(Row(ItemAt(CurrentSelection(index))));
}

void ColumnListView::FullListDoForEach(const std::function<bool(CLVListItem*)>& visit) const {
    for (int32 i = 0; i < FullListCountItems(); ++i)
        if (visit(FullListItemAt(i)))
            return;
}
