#pragma once

#include <functional>

#include "platform/Control.h"
#include "platform/List.h"

class BListView;

// One row of a list view. The list borrows its rows: who adds a row deletes it after taking it out.
class BListItem {
  public:
    explicit BListItem(uint32 outlineLevel = 0, bool expanded = true)
        : outlineLevel_(outlineLevel), expanded_(expanded) {}
    virtual ~BListItem();
    BListItem(const BListItem&) = delete;
    BListItem& operator=(const BListItem&) = delete;

    // Draws the row, with owner's drawing calls, into rowRect (owner's coordinates). complete: nothing of the
    // row's background is painted yet.
    virtual void DrawItem(BView* owner, BRect rowRect, bool complete = false) = 0;
    // Works out the height (and what else depends on the font); called when the row joins a list and when the
    // list's font changes. The base takes the font's height.
    virtual void Update(BView* owner, const BFont* font);
    // What assistive technology reads for the row; UTF-8.
    [[nodiscard]] virtual std::string AccessibleText() const { return {}; }
    // What typed letters are looked for at the beginning of; UTF-8. Every row may be asked. The base takes
    // the accessible text.
    [[nodiscard]] virtual std::string SearchText() const { return AccessibleText(); }

    [[nodiscard]] float Height() const { return height_; }
    void SetHeight(float height) { height_ = height; }
    [[nodiscard]] bool IsSelected() const { return selected_; }
    [[nodiscard]] uint32 OutlineLevel() const { return outlineLevel_; }
    void SetOutlineLevel(uint32 level) { outlineLevel_ = level; }
    [[nodiscard]] bool IsExpanded() const { return expanded_; }
    void SetExpanded(bool expanded) { expanded_ = expanded; }

  private:
    friend struct ListAccess;

    BListView* list_ = nullptr; // the list that shows the row
    float height_ = 0;
    uint32 outlineLevel_;
    bool selected_ = false;
    bool expanded_;
};

enum list_view_type { B_SINGLE_SELECTION_LIST, B_MULTIPLE_SELECTION_LIST };

// A list of rows, drawn for the visible ones only, so that its size costs nothing but memory. Rows are
// borrowed. Selection and keys are the toolkit's own: arrows, Home, End, Page keys, Shift and Control clicks,
// typed letters; Left and Right scroll. As long as no row was chosen, they begin at the first row, and End at
// the last. A double click or Enter sends the invocation message.
class BListView : public BView, public BInvoker {
  public:
    BListView(BRect frame, const char* name, list_view_type type = B_SINGLE_SELECTION_LIST,
              uint32 resizingMode = B_FOLLOW_LEFT | B_FOLLOW_TOP,
              uint32 flags = B_WILL_DRAW | B_FRAME_EVENTS | B_NAVIGABLE);
    ~BListView() override;

    // --- rows; an index from 0 to CountItems() ---
    virtual bool AddItem(BListItem* item);
    virtual bool AddItem(BListItem* item, int32 index);
    // Many rows at once, at the cost of one change; newItems holds BListItem pointers. All or none are added:
    // a null, or a row that is in a list already, refuses them all.
    virtual bool AddList(BList* newItems);
    virtual bool AddList(BList* newItems, int32 index);
    // Hand rows back to the caller; false or null, with nothing changed, when they are not there.
    virtual bool RemoveItem(BListItem* item);
    virtual BListItem* RemoveItem(int32 index);
    virtual bool RemoveItems(int32 index, int32 count);
    // Takes out the selected rows, at the cost of one change; the rows are not deleted. So for every row.
    virtual void RemoveSelected();
    virtual void MakeEmpty();
    [[nodiscard]] BListItem* ItemAt(int32 index) const;
    [[nodiscard]] int32 IndexOf(const BListItem* item) const;
    // The row at this point of the view's coordinates; -1 when there is none.
    [[nodiscard]] int32 IndexOf(BPoint point) const;
    [[nodiscard]] int32 CountItems() const;

    // --- selection ---
    void Select(int32 index, bool extend = false);
    void Select(int32 from, int32 to, bool extend = false);
    void DeselectAll();
    [[nodiscard]] bool IsItemSelected(int32 index) const;
    // The index of the index-th selected row, counted from the top; -1 when fewer are selected. All rows
    // up to it are looked at; who wants them all asks every row.
    [[nodiscard]] int32 CurrentSelection(int32 index = 0) const;
    // The row that keys go on from, selected or not; -1 when there is none.
    [[nodiscard]] int32 CurrentRow() const;
    // Makes it this one, without selecting it and without scrolling.
    void SetCurrentRow(int32 index);

    // Takes ownership of message.
    void SetInvocationMessage(BMessage* message) { SetMessage(message); }

    // Orders the rows by the comparison (below 0: first before second); equal rows keep their order, and the
    // selection stays with its rows.
    void SortItems(const std::function<int(const BListItem*, const BListItem*)>& compare);

    [[nodiscard]] BRect ItemFrame(int32 index) const;
    void InvalidateItem(int32 index);
    // How far the content reaches to the right; the horizontal scroll bar's range follows.
    void SetDataWidth(float width);

    // Called for a press on the rows; the base selects. Press details are in the window's CurrentMessage.
    void MouseDown(BPoint where) override;
    // Called when the rows were scrolled, by whatever means, and to scroll them.
    void ScrollTo(BPoint where) override;
    // Scrolls up or down, no further than needed, until the row is seen.
    void ScrollToRow(int32 index);
    [[nodiscard]] BRect Bounds() const override;
    void SetFont(const BFont* font) override;

  protected:
    [[nodiscard]] BMessenger DefaultTarget() const override;

  private:
    friend struct ListAccess;

    bool AddRows(std::vector<BListItem*> rows, int32 index);
};
