#include "ColumnListView/CLVColumnLabelView.h"

#include <algorithm>
#include <cmath>

#include "ColumnListView/ColumnListView.h"
#include "ColumnListView/MouseWatcher.h"
#include "platform/Window.h"

namespace {

constexpr rgb_color Background{216, 216, 216, 255};
constexpr rgb_color Light{255, 255, 255, 255};
constexpr rgb_color Shadow{152, 152, 152, 255};
constexpr rgb_color Highlight{0, 0, 229, 255};
constexpr float DragReach = 2;  // sideways moves up to here are still a click
constexpr float WidthStep = 10; // of a key press

uint32 Field(const BMessage* message, const char* name, uint32 fallback) {
    auto value = static_cast<int32>(fallback);
    if (message)
        message->FindInt32(name, &value);
    return static_cast<uint32>(value);
}

} // namespace

CLVColumnLabelView::CLVColumnLabelView(BRect frame, ColumnListView* list, const BFont* font)
    : BView(frame, "column labels", B_FOLLOW_LEFT_RIGHT | B_FOLLOW_TOP, B_WILL_DRAW | B_NAVIGABLE),
      list_(list) {
    SetFont(font);
    SetViewColor(Background);
    font_height height;
    font->GetHeight(&height);
    ascent_ = std::round(height.ascent);
}

CLVColumnLabelView::~CLVColumnLabelView() = default;

float CLVColumnLabelView::HeightFor(const BFont& font) {
    font_height height;
    font.GetHeight(&height);
    return std::round(height.ascent) + std::round(height.descent) + 4;
}

void CLVColumnLabelView::CancelPress() {
    watcher_.reset();
    if (press_.action == Action::None)
        return;
    press_ = {};
    Invalidate();
}

void CLVColumnLabelView::DetachedFromWindow() {
    CancelPress();
}

// --- the pointer ---

void CLVColumnLabelView::MouseDown(BPoint where) {
    const BMessage* message = Window() ? Window()->CurrentMessage() : nullptr;
    const uint32 buttons = Field(message, "buttons", B_PRIMARY_MOUSE_BUTTON);
    if (buttons != B_PRIMARY_MOUSE_BUTTON) {
        CancelPress();
        return;
    }
    // The button was released and pressed again between two looks of the watcher: the first press is over.
    if (press_.action != Action::None)
        Release(press_.releasedAt.value_or(press_.lastAt), press_.modifiers);
    Begin(where, Field(message, "modifiers", modifiers()));
}

void CLVColumnLabelView::MouseUp(BPoint where) {
    press_.releasedAt = where;
}

void CLVColumnLabelView::Begin(BPoint where, uint32 modifierKeys) {
    const HeaderHit hit = list_->HitTestHeader(where.x);
    if (hit.what == HeaderHit::What::Nothing)
        return;
    watcher_ = MouseWatcher::Start(this, where, B_PRIMARY_MOUSE_BUTTON, ++pressCount_);
    if (!watcher_)
        return;
    press_ = {};
    press_.column = list_->ColumnsInDisplayOrder()[static_cast<std::size_t>(hit.position)];
    press_.pressedAt = press_.lastAt = where;
    press_.modifiers = modifierKeys;
    if (hit.what == HeaderHit::What::Border) {
        press_.action = Action::Resize;
        press_.grabOffset = where.x - press_.column->End();
    } else {
        press_.action = Action::Press;
    }
    Invalidate();
}

void CLVColumnLabelView::MessageReceived(BMessage* message) {
    const uint32 what = message->what;
    if (what != MouseWatcherUp && what != MouseWatcherMoved && what != MouseWatcherDown) {
        BView::MessageReceived(message);
        return;
    }
    const auto press = static_cast<uint32>(pressCount_);
    if (press_.action == Action::None || Field(message, "press", press) != press)
        return;
    BPoint where = press_.lastAt;
    message->FindPoint("where", &where);
    const uint32 buttons = Field(message, "buttons", 0);
    if (buttons == 0)
        Release(where, Field(message, "modifiers", 0));
    else if (buttons == B_PRIMARY_MOUSE_BUTTON)
        Move(where);
    else
        CancelPress();
}

// On dense screens the pointer has fractions of a pixel; edges keep to whole ones, so that they stay sharp.
void CLVColumnLabelView::Move(BPoint where) {
    press_.lastAt = where;
    if (press_.action == Action::Press && std::fabs(where.x - press_.pressedAt.x) > DragReach)
        StartDrag();
    if (press_.action == Action::Resize)
        press_.column->SetWidth(std::round(where.x - press_.grabOffset - press_.column->Begin()));
    else if (press_.action == Action::Drag)
        DragTo(where.x);
}

// A move that the watcher had no time to report is made up for first.
void CLVColumnLabelView::Release(BPoint where, uint32 modifierKeys) {
    if (where != press_.lastAt)
        Move(where);
    const bool isClick = press_.action == Action::Press;
    const int32 column = isClick ? list_->IndexOfColumn(press_.column) : -1;
    CancelPress();
    if (column >= 0)
        Sort(column, modifierKeys);
}

void CLVColumnLabelView::Sort(int32 column, uint32 modifierKeys) {
    if ((list_->ColumnAt(column)->Flags() & CLVF_SORTABLE) == 0)
        return;
    const bool extends = (modifierKeys & B_SHIFT_KEY) != 0;
    if (extends ? list_->IsSortKey(column) : list_->PrimarySortKey() == column)
        list_->ReverseSortMode(column);
    else if (extends)
        list_->AddSortKey(column);
    else
        list_->SetSortKey(column);
}

// --- the keyboard ---

std::vector<CLVColumn*> CLVColumnLabelView::MarkableColumns() const {
    std::vector<CLVColumn*> columns;
    for (CLVColumn* column : list_->ColumnsInDisplayOrder())
        if (column->IsShown() && column->GetLabel())
            columns.push_back(column);
    return columns;
}

CLVColumn* CLVColumnLabelView::MarkedColumn() const {
    const std::vector<CLVColumn*> columns = MarkableColumns();
    const auto found = std::find(columns.begin(), columns.end(), list_->ColumnAt(marked_));
    return found != columns.end() ? *found : columns.empty() ? nullptr : columns.front();
}

void CLVColumnLabelView::MoveMark(char key) {
    const std::vector<CLVColumn*> columns = MarkableColumns();
    auto at = std::find(columns.begin(), columns.end(), MarkedColumn());
    if (key == B_HOME)
        at = columns.begin();
    else if (key == B_END)
        at = columns.end() - 1;
    else if (key == B_LEFT_ARROW && at != columns.begin())
        --at;
    else if (key == B_RIGHT_ARROW && at != columns.end() - 1)
        ++at;
    marked_ = list_->IndexOfColumn(*at);
    list_->ScrollToColumn(**at);
    Invalidate();
}

bool CLVColumnLabelView::KeyDown(char key) {
    CLVColumn* column = MarkedColumn();
    if (!column)
        return false;
    const bool resizable = (column->Flags() & CLVF_FIXED_WIDTH) == 0;
    switch (key) {
    case B_LEFT_ARROW:
    case B_RIGHT_ARROW:
    case B_HOME:
    case B_END:
        MoveMark(key);
        return true;
    case ' ':
    case B_ENTER:
        Sort(list_->IndexOfColumn(column), modifiers());
        Invalidate();
        return true;
    case '+':
    case '-':
        if (resizable)
            column->SetWidth(column->Width() + (key == '+' ? WidthStep : -WidthStep));
        return true;
    default:
        return false;
    }
}

int32 CLVColumnLabelView::PressedGroup() const {
    const std::vector<CLVColumn*>& order = list_->ColumnsInDisplayOrder();
    const auto found = std::find(order.begin(), order.end(), press_.column);
    return GroupAt(list_->DragGroups(), static_cast<int32>(found - order.begin()));
}

void CLVColumnLabelView::StartDrag() {
    const DragGroup& group = list_->DragGroups()[static_cast<std::size_t>(PressedGroup())];
    if ((group.flags & CLVF_FIXED_POSITION) != 0) {
        CancelPress();
        return;
    }
    press_.action = Action::Drag;
    press_.grabOffset = press_.pressedAt.x - group.begin;
}

void CLVColumnLabelView::DragTo(float x) {
    // Each swap takes the group one place further the same way, so there are fewer than groups.
    for (std::size_t swaps = list_->DragGroups().size(); swaps > 0 && press_.action == Action::Drag;
         --swaps) {
        const int32 dragged = PressedGroup();
        const int32 target = GroupToSwapWith(list_->DragGroups(), dragged, x);
        if (target < 0)
            break;
        list_->MoveDragGroup(dragged, target);
    }
    Invalidate();
}

// --- drawing ---

void CLVColumnLabelView::Draw(BRect updateRect) {
    bool joinsPrevious = false;
    const BRect bounds = Bounds();
    const std::vector<CLVColumn*>& order = list_->ColumnsInDisplayOrder();
    for (CLVColumn* column : order) {
        if (!column->IsShown())
            continue;
        const BRect cell(column->Begin(), bounds.top, column->End(), bounds.bottom);
        const bool isLast = column->End() == list_->ColumnsEnd();
        const bool joinsNext = !isLast && (column->Flags() & CLVF_JOIN_HEADER) != 0;
        if (cell.Intersects(updateRect))
            DrawCell(*column, cell, joinsPrevious, joinsNext);
        joinsPrevious = joinsNext;
    }
    const BRect rest(list_->ColumnsEnd() + 1, bounds.top, bounds.right, bounds.bottom);
    if (rest.Intersects(updateRect))
        DrawBevel(rest, false, true, false);
    if (press_.action == Action::Drag)
        DrawOutline();
}

void CLVColumnLabelView::DrawCell(CLVColumn& column, BRect cell, bool joinsPrevious, bool joinsNext) {
    const bool isPressed = press_.column == &column;
    DrawBevel(cell, joinsPrevious, joinsNext, isPressed && press_.action == Action::Resize);
    const BRegion inside(BRect(cell.left + 1, cell.top + 1, cell.right - 1, cell.bottom - 1));
    ConstrainClippingRegion(&inside);
    const bool isKey =
        list_->IsSortKey(list_->IndexOfColumn(&column)) && column.SortMode() != CLVSortMode::None;
    column.headerRect_ = cell;
    column.DrawColumnHeader(this, cell, isKey, isPressed && press_.action != Action::Resize, ascent_);
    if (IsFocus() && MarkedColumn() == &column) {
        SetHighColor(Highlight);
        StrokeRect({cell.left + 2, cell.top + 2, cell.right - 2, cell.bottom - 2});
    }
    ConstrainClippingRegion(nullptr);
}

void CLVColumnLabelView::DrawBevel(BRect cell, bool joinsPrevious, bool joinsNext, bool resizing) {
    SetHighColor(Light);
    StrokeLine({cell.left, cell.top}, {cell.right, cell.top});
    if (!joinsPrevious)
        StrokeLine({cell.left, cell.top}, {cell.left, cell.bottom});
    SetHighColor(Shadow);
    StrokeLine({cell.left, cell.bottom}, {cell.right, cell.bottom});
    if (!joinsNext || resizing) {
        SetHighColor(resizing ? Highlight : Shadow);
        StrokeLine({cell.right, cell.top}, {cell.right, cell.bottom});
    }
}

void CLVColumnLabelView::DrawOutline() {
    const DragGroup& group = list_->DragGroups()[static_cast<std::size_t>(PressedGroup())];
    const BRect bounds = Bounds();
    const float width = group.end - group.begin;
    const float left =
        std::max(bounds.left, std::min(press_.lastAt.x - press_.grabOffset, bounds.right - width));
    SetHighColor(Highlight);
    StrokeRect({left, bounds.top, left + width, bounds.bottom});
}

// --- assistive technology ---

std::string CLVColumnLabelView::Sorting(const CLVColumn& column) const {
    std::vector<int32> keys(static_cast<std::size_t>(list_->CountColumns()));
    keys.resize(static_cast<std::size_t>(list_->Sorting(keys.data(), nullptr)));
    const auto found = std::find(keys.begin(), keys.end(), list_->IndexOfColumn(&column));
    if (found == keys.end())
        return {};
    const std::string direction = column.SortMode() == CLVSortMode::Ascending ? "ascending" : "descending";
    const std::string place = keys.size() > 1 ? ", key " + std::to_string(found - keys.begin() + 1) : "";
    return "sorted " + direction + place;
}

std::string CLVColumnLabelView::AccessibleDescription() const {
    std::string description;
    for (const CLVColumn* column : MarkableColumns()) {
        description += (description.empty() ? "Columns: " : ", ") + std::string(column->GetLabel());
        if (const std::string sorting = Sorting(*column); !sorting.empty())
            description += " (" + sorting + ")";
    }
    return description;
}

std::vector<AccessiblePart> CLVColumnLabelView::AccessibleParts() const {
    std::vector<AccessiblePart> cells;
    const BRect bounds = Bounds();
    for (const CLVColumn* column : MarkableColumns())
        cells.push_back({column->GetLabel(),
                         Sorting(*column),
                         {column->Begin(), bounds.top, column->End(), bounds.bottom},
                         column == MarkedColumn()});
    return cells;
}

void CLVColumnLabelView::PressPart(int32 index) {
    Sort(list_->IndexOfColumn(MarkableColumns()[static_cast<std::size_t>(index)]), 0);
    Invalidate();
}
