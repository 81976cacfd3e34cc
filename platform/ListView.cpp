#include "platform/ListView.h"

#include <algorithm>
#include <cmath>

#include "platform/Window.h"
#include "platform/private/Convert.h"
#include "platform/private/ListPeer.h"

ListPeer& ListAccess::Peer(const BListView& list) {
    return *static_cast<ListPeer*>(list.Peer());
}

int ListAccess::Pixels(const BListItem& row) {
    return std::max(1, static_cast<int>(std::ceil(row.height_)));
}

void ListPeer::TakeHeights(const std::vector<BListItem*>& rows) {
    if (model.Count() == 0) {
        Rows()->setUniformItemSizes(true);
        rowHeight_ = ListAccess::Pixels(*rows.front());
    }
    const auto same = [&](const BListItem* row) { return ListAccess::Pixels(*row) == rowHeight_; };
    if (!std::all_of(rows.begin(), rows.end(), same))
        Rows()->setUniformItemSizes(false);
}

void ListPeer::LayOutAgain() {
    const std::vector<BListItem*> rows = model.Rows();
    if (rows.empty())
        return;
    Rows()->setUniformItemSizes(true);
    rowHeight_ = ListAccess::Pixels(*rows.front());
    TakeHeights(rows);
    Rows()->LayOutSoon();
}

BListItem::~BListItem() {
    if (list_)
        list_->RemoveItem(this);
}

void BListItem::Update(BView*, const BFont* font) {
    font_height height;
    font->GetHeight(&height);
    height_ = std::ceil(height.ascent) + std::ceil(height.descent) + std::ceil(height.leading);
}

// Resizing tells the size of what is seen of the rows, so the view's own telling stays out of it.
BListView::BListView(BRect frame, const char* name, list_view_type type, uint32 resizingMode, uint32 flags)
    : BView(frame, name, resizingMode, flags & ~B_FRAME_EVENTS, std::make_unique<ListPeer>(this)),
      BInvoker(nullptr, nullptr) {
    ListPeer& peer = ListAccess::Peer(*this);
    peer.frameEvents = flags & B_FRAME_EVENTS;
    RowsWidget* rows = peer.Rows();
    rows->SetPeer(&peer);
    rows->SetBars(false, false);
    rows->setAccessibleName(QString::fromUtf8(Name()));
    rows->setSelectionMode(type == B_MULTIPLE_SELECTION_LIST ? QAbstractItemView::ExtendedSelection
                                                             : QAbstractItemView::SingleSelection);
}

BListView::~BListView() {
    const ListPeer& peer = ListAccess::Peer(*this);
    if (peer.widget)
        peer.Rows()->Orphan();
    for (BListItem* row : peer.model.Rows())
        ListAccess::SetList(*row, nullptr);
}

bool BListView::AddItem(BListItem* item) {
    return AddRows({item}, CountItems());
}

bool BListView::AddItem(BListItem* item, int32 index) {
    return AddRows({item}, index);
}

bool BListView::AddList(BList* newItems) {
    return AddList(newItems, CountItems());
}

bool BListView::AddList(BList* newItems, int32 index) {
    if (!newItems)
        return false;
    std::vector<BListItem*> rows;
    rows.reserve(static_cast<std::size_t>(newItems->CountItems()));
    for (int32 place = 0; place < newItems->CountItems(); ++place)
        rows.push_back(static_cast<BListItem*>(newItems->ItemAt(place)));
    return AddRows(std::move(rows), index);
}

// One pass over the rows: with many of them, each is a wait for memory.
bool BListView::AddRows(std::vector<BListItem*> rows, int32 index) {
    if (index < 0 || index > CountItems())
        return false;
    BFont font;
    GetFont(&font);
    for (std::size_t place = 0; place < rows.size(); ++place) {
        BListItem* row = rows[place];
        if (!row || ListAccess::List(*row)) {
            for (std::size_t taken = 0; taken < place; ++taken)
                ListAccess::SetList(*rows[taken], nullptr);
            return false;
        }
        ListAccess::SetList(*row, this);
        ListAccess::SetSelected(*row, false);
        row->Update(this, &font);
    }
    if (rows.empty())
        return true;
    ListPeer& peer = ListAccess::Peer(*this);
    peer.TakeHeights(rows);
    peer.selection.Detach();
    peer.model.Insert(index, rows);
    return true;
}

bool BListView::RemoveItem(BListItem* item) {
    const int32 index = IndexOf(item);
    return index >= 0 && RemoveItem(index) != nullptr;
}

BListItem* BListView::RemoveItem(int32 index) {
    BListItem* row = ItemAt(index);
    if (row)
        RemoveItems(index, 1);
    return row;
}

bool BListView::RemoveItems(int32 index, int32 count) {
    if (index < 0 || count < 0 || count > CountItems() - index)
        return false;
    if (count == 0)
        return true;
    ListPeer& peer = ListAccess::Peer(*this);
    const auto first = peer.model.Rows().begin() + index;
    const std::vector<BListItem*> rows(first, first + count);
    peer.selection.Detach();
    peer.model.Remove(index, count);
    peer.selection.RowsRemoved(index, rows);
    return true;
}

void BListView::RemoveSelected() {
    ListAccess::Peer(*this).selection.RemoveSelected();
}

void BListView::MakeEmpty() {
    ListPeer& peer = ListAccess::Peer(*this);
    const std::vector<BListItem*> rows = peer.model.Rows();
    peer.selection.Detach();
    peer.model.Replace({});
    peer.selection.RowsRemoved(0, rows);
}

BListItem* BListView::ItemAt(int32 index) const {
    return ListAccess::Peer(*this).model.At(index);
}

int32 BListView::IndexOf(const BListItem* item) const {
    return item && ListAccess::List(*item) == this ? ListAccess::Peer(*this).model.IndexOf(item) : -1;
}

int32 BListView::IndexOf(BPoint point) const {
    const RowsWidget* rows = ListAccess::Peer(*this).Rows();
    return rows->indexAt(ToQt(point - rows->Offset()).toPoint()).row();
}

int32 BListView::CountItems() const {
    return ListAccess::Peer(*this).model.Count();
}

void BListView::Select(int32 index, bool extend) {
    Select(index, index, extend);
}

void BListView::Select(int32 from, int32 to, bool extend) {
    const int32 first = std::max(from, 0);
    const int32 last = std::min(to, CountItems() - 1);
    if (first <= last)
        ListAccess::Peer(*this).selection.Select(first, last, extend);
}

void BListView::DeselectAll() {
    ListAccess::Peer(*this).selection.Clear();
}

bool BListView::IsItemSelected(int32 index) const {
    const BListItem* row = ItemAt(index);
    return row && row->IsSelected();
}

int32 BListView::CurrentSelection(int32 index) const {
    return ListAccess::Peer(*this).selection.Nth(index);
}

int32 BListView::CurrentRow() const {
    return ListAccess::Peer(*this).selection.Current();
}

void BListView::SetCurrentRow(int32 index) {
    ListAccess::Peer(*this).selection.SetCurrent(index);
}

void BListView::SortItems(const std::function<int(const BListItem*, const BListItem*)>& compare) {
    ListPeer& peer = ListAccess::Peer(*this);
    std::vector<BListItem*> rows = peer.model.Rows();
    std::stable_sort(rows.begin(), rows.end(),
                     [&](const BListItem* a, const BListItem* b) { return compare(a, b) < 0; });
    peer.selection.Detach();
    peer.model.Reorder(std::move(rows));
}

BRect BListView::ItemFrame(int32 index) const {
    const ListPeer& peer = ListAccess::Peer(*this);
    if (!peer.model.At(index))
        return {};
    // First, as it lays out rows that have come or gone, whereby the list may scroll.
    BRect frame = FromQt(QRectF(peer.Rows()->visualRect(peer.model.index(index))));
    const BPoint offset = peer.Rows()->Offset();
    frame.OffsetBy(offset.x, offset.y);
    return frame;
}

void BListView::InvalidateItem(int32 index) {
    Invalidate(ItemFrame(index));
}

void BListView::SetDataWidth(float width) {
    ListPeer& peer = ListAccess::Peer(*this);
    if (width == peer.dataWidth)
        return;
    peer.dataWidth = width;
    peer.Rows()->DataWidthChanged();
}

void BListView::MouseDown(BPoint where) {
    if (ListAccess::Peer(*this).Rows()->ForwardPress())
        return;
    const int32 index = IndexOf(where);
    if (index < 0)
        DeselectAll();
    else
        Select(index);
}

void BListView::ScrollTo(BPoint where) {
    RowsWidget* rows = ListAccess::Peer(*this).Rows();
    if (where != rows->Offset())
        rows->SetOffset(where);
}

void BListView::ScrollToRow(int32 index) {
    const BRect row = ItemFrame(index);
    const BRect seen = Bounds();
    if (row.IsValid())
        ScrollTo({seen.left, std::min(row.top, std::max(seen.top, row.bottom - seen.Height()))});
}

BRect BListView::Bounds() const {
    const RowsWidget* rows = ListAccess::Peer(*this).Rows();
    const BPoint offset = rows->Offset();
    const QSize size = rows->VisibleSize();
    return {offset.x, offset.y, offset.x + static_cast<float>(size.width() - 1),
            offset.y + static_cast<float>(size.height() - 1)};
}

void BListView::SetFont(const BFont* font) {
    BView::SetFont(font);
    ListPeer& peer = ListAccess::Peer(*this);
    peer.Rows()->setFont(FontAccess::ToQt(*font));
    for (BListItem* row : peer.model.Rows())
        row->Update(this, font);
    peer.LayOutAgain();
}

BMessenger BListView::DefaultTarget() const {
    return BMessenger(Window());
}
