#pragma once

#include <memory>
#include <optional>

#include "platform/View.h"

class CLVColumn;
class ColumnListView;
class MouseWatcher;

// The header row of a ColumnListView: draws one raised cell for each shown column and turns presses on cells
// and borders into the list's operations. By keyboard, reached with Tab, a mark goes from cell to cell with
// Left, Right, Home and End; Space and Enter do what a click does, plus and minus make the column wider and
// narrower. It keeps nothing but the press under way and the mark; columns, their places and the sort keys
// are the list's. Its coordinates are the list's sideways, so both scroll alike.
//
// The container of the list owns it. Interface thread, with the window's lock held; the pointer is followed
// by a MouseWatcher, whose messages this view answers.
class CLVColumnLabelView : public BView {
  public:
    // list outlives the press under way, but not necessarily this view.
    CLVColumnLabelView(BRect frame, ColumnListView* list, const BFont* font);
    ~CLVColumnLabelView() override;

    // The header's height (bottom minus top) for labels in this font.
    [[nodiscard]] static float HeightFor(const BFont& font);

    // Drops the press, resize or drag under way without sorting; a drag keeps the order reached.
    void CancelPress();

    void Draw(BRect updateRect) override;
    void MouseDown(BPoint where) override;
    void MouseUp(BPoint where) override;
    bool KeyDown(char key) override;
    void MessageReceived(BMessage* message) override;
    void DetachedFromWindow() override;
    // The shown columns' labels from left to right, each sort key with its direction.
    [[nodiscard]] std::string AccessibleDescription() const override;
    // The cells of the shown columns that have a label; a sort key's says its place and direction. A press
    // sorts like a click.
    [[nodiscard]] std::vector<AccessiblePart> AccessibleParts() const override;
    void PressPart(int32 index) override;

  private:
    enum class Action { None, Press, Resize, Drag };

    // The press under way; meaningful while action is not None.
    struct Press {
        Action action = Action::None;
        CLVColumn* column = nullptr; // pressed, dragged or resized
        BPoint pressedAt;
        BPoint lastAt;                    // the pointer as of the last move acted on
        std::optional<BPoint> releasedAt; // the release was seen, but not yet by the watcher
        float grabOffset = 0;             // pointer minus the border, or minus the dragged group's begin
        uint32 modifiers = 0;
    };

    void Begin(BPoint where, uint32 modifiers);
    void Move(BPoint where);
    void Release(BPoint where, uint32 modifiers);
    void StartDrag();
    void DragTo(float x);
    void Sort(int32 column, uint32 modifiers);

    // The shown columns that have a label, from left to right: where the keyboard's mark can stand.
    [[nodiscard]] std::vector<CLVColumn*> MarkableColumns() const;
    // Null while there is none to mark.
    [[nodiscard]] CLVColumn* MarkedColumn() const;
    void MoveMark(char key);
    // "sorted ascending", "sorted descending, key 2"; empty for a column that is no sort key.
    [[nodiscard]] std::string Sorting(const CLVColumn& column) const;

    [[nodiscard]] int32 PressedGroup() const;
    void DrawCell(CLVColumn& column, BRect cell, bool joinsPrevious, bool joinsNext);
    void DrawBevel(BRect cell, bool joinsPrevious, bool joinsNext, bool resizing);
    void DrawOutline();

    ColumnListView* list_;
    float ascent_; // of the label font, rounded
    Press press_;
    int32 marked_ = 0;     // the index of the column with the keyboard's mark
    int32 pressCount_ = 0; // tells a watcher's late messages from those of the press under way
    std::unique_ptr<MouseWatcher> watcher_;
};
