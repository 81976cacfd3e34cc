#pragma once

#include <memory>
#include <vector>

#include "platform/Bitmap.h"
#include "platform/Font.h"
#include "platform/Handler.h"
#include "platform/Rect.h"

class BMenu;
class BWindow;
struct ViewPeer;

// Which edges of the parent a view's edges follow when the parent is resized. A view that follows both of two
// opposite edges grows and shrinks.
constexpr uint32 B_FOLLOW_NONE = 0;
constexpr uint32 B_FOLLOW_LEFT = 0x0001;
constexpr uint32 B_FOLLOW_RIGHT = 0x0002;
constexpr uint32 B_FOLLOW_LEFT_RIGHT = 0x0003;
constexpr uint32 B_FOLLOW_TOP = 0x0010;
constexpr uint32 B_FOLLOW_BOTTOM = 0x0020;
constexpr uint32 B_FOLLOW_ALL_SIDES = 0x0033;

constexpr uint32 B_WILL_DRAW = 0x01;
constexpr uint32 B_FRAME_EVENTS = 0x02;
// The keyboard reaches the view by Tab.
constexpr uint32 B_NAVIGABLE = 0x04;
// The view hears of the pointer's moves.
constexpr uint32 B_MOUSE_MOVES = 0x08;
// How the pointer moved: in the view, or out of it.
constexpr uint32 B_INSIDE_VIEW = 1;
constexpr uint32 B_EXITED_VIEW = 2;

enum drawing_mode { B_OP_COPY, B_OP_OVER };

// Pointer buttons and modifier keys, as GetMouse and modifiers report them.
constexpr uint32 B_PRIMARY_MOUSE_BUTTON = 1;
constexpr uint32 B_SECONDARY_MOUSE_BUTTON = 2;
constexpr uint32 B_TERTIARY_MOUSE_BUTTON = 4;
constexpr uint32 B_SHIFT_KEY = 1;

// The keys that a view hears of beside printable ASCII characters.
constexpr char B_HOME = 0x01;
constexpr char B_END = 0x04;
constexpr char B_ENTER = 0x0a;
constexpr char B_LEFT_ARROW = 0x1c;
constexpr char B_RIGHT_ARROW = 0x1d;
constexpr char B_UP_ARROW = 0x1e;
constexpr char B_DOWN_ARROW = 0x1f;

// A part of a view that a person takes for a small control, as assistive technology tells of it.
struct AccessiblePart {
    std::string name;
    std::string state; // beside the name
    BRect frame;       // in the view's coordinates
    bool marked;       // has the keyboard's mark
};

// The modifier keys held down as of the last event. Any thread.
uint32 modifiers();

// A rectangle of a window that draws itself, takes the pointer and keys, and holds child views. A child
// belongs to its parent, which deletes it; RemoveChild hands it back. Coordinates are those of the view's own
// bounds, in logical pixels; rectangles include their edges.
//
// Drawing happens inside Draw, while the layer runs a paint pass (of the screen, of a picture in a test or of
// a printed page); the same call at any other time draws nothing and asks for a paint pass instead. Shapes
// and text are smooth. Everything but GetMouse is for the interface thread, with the window's lock held once
// the view is in a window.
class BView : public BHandler {
  public:
    // frame is in the parent's coordinates; flags are the B_WILL_DRAW family.
    BView(BRect frame, const char* name, uint32 resizingMode, uint32 flags);
    ~BView() override;

    [[nodiscard]] BLooper* Looper() const override;

    // --- the tree ---
    // Takes ownership. A view that is in a tree already is refused.
    void AddChild(BView* child);
    // Gives the child back to the caller; false when it is not a child of this view.
    bool RemoveChild(BView* child);
    bool RemoveSelf();
    [[nodiscard]] BView* Parent() const { return parent_; }
    [[nodiscard]] BWindow* Window() const { return window_; }
    [[nodiscard]] int32 CountChildren() const { return static_cast<int32>(children_.size()); }
    [[nodiscard]] BView* ChildAt(int32 index) const;
    // This view or the first below it that has the name; null when there is none.
    [[nodiscard]] BView* FindView(const char* name) const;

    // --- hooks ---
    virtual void AttachedToWindow() {}
    virtual void DetachedFromWindow() {}
    // Draws the part of the view that updateRect covers.
    virtual void Draw(BRect updateRect);
    // Called for views with B_FRAME_EVENTS: the new Width() and Height().
    virtual void FrameResized(float width, float height);
    virtual void MouseDown(BPoint where);
    virtual void MouseUp(BPoint where);
    // Called for views with B_MOUSE_MOVES, at once: where the pointer is, or was last.
    virtual void MouseMoved(BPoint where, uint32 transit);
    // A key was pressed while the view has the focus (see B_NAVIGABLE), with no modifier key but Shift held.
    // False lets the key go on to the window, where Enter and Escape have their meaning.
    virtual bool KeyDown(char key);
    // Opens the menu, whose items are complete, where the person asks for it in the view; its shortcuts work
    // while the view's window is in front. Items without a target send to that window. Takes ownership.
    void SetContextMenu(BMenu* menu);
    // What assistive technology calls the view; UTF-8. At first its name, or a control's label.
    void SetAccessibleName(const char* name);
    [[nodiscard]] std::string AccessibleName() const;
    // The text that assistive technology reads for this view beside its name; UTF-8. The base has none.
    [[nodiscard]] virtual std::string AccessibleDescription() const { return {}; }
    // What the view draws instead of child views, for assistive technology to go through, from left to right.
    // The base has no such parts.
    [[nodiscard]] virtual std::vector<AccessiblePart> AccessibleParts() const { return {}; }
    // Assistive technology presses that part.
    virtual void PressPart(int32 /*index*/) {}

    // --- place and size ---
    [[nodiscard]] BRect Frame() const;
    // The visible rectangle in the view's own coordinates: its left top is where the view is scrolled to.
    [[nodiscard]] virtual BRect Bounds() const;
    void MoveTo(float x, float y);
    void ResizeTo(float width, float height);
    virtual void ScrollTo(BPoint where);

    // Hiding nests: a view hidden twice must be shown twice.
    void Show();
    void Hide();
    [[nodiscard]] bool IsHidden() const { return hideCount_ > 0; }

    virtual void MakeFocus(bool focus = true);
    [[nodiscard]] virtual bool IsFocus() const;

    // The pointer's place in this view and the buttons held, as of the last event that reached the view.
    // While a button that was pressed in the view is held, all pointer events reach it. Any thread.
    void GetMouse(BPoint* where, uint32* buttons) const;

    // --- drawing state ---
    // The background, painted before Draw.
    void SetViewColor(rgb_color color);
    [[nodiscard]] rgb_color ViewColor() const { return viewColor_; }
    virtual void SetHighColor(rgb_color color);
    [[nodiscard]] rgb_color HighColor() const { return highColor_; }
    void SetLowColor(rgb_color color) { lowColor_ = color; }
    void SetDrawingMode(drawing_mode mode) { drawingMode_ = mode; }
    // Width of lines and outlines; 1 at first.
    void SetPenSize(float size) { penSize_ = size; }
    [[nodiscard]] float PenSize() const { return penSize_; }
    void MovePenTo(float x, float y) { pen_ = {x, y}; }

    virtual void SetFont(const BFont* font);
    void SetFontSize(float size);
    void GetFont(BFont* font) const { *font = font_; }
    [[nodiscard]] float StringWidth(const char* text) const { return font_.StringWidth(text); }
    void GetFontHeight(font_height* height) const { font_.GetHeight(height); }

    // Limits drawing to region; null lifts the limit.
    void ConstrainClippingRegion(const BRegion* region);
    // The area that drawing is limited to now: the region given last, else the bounds.
    void GetClippingRegion(BRegion* region) const;

    // --- drawing, in the high colour; outlines lie inside the shape's rectangle ---
    void StrokeLine(BPoint from, BPoint to);
    // From the pen, which moves to the line's end.
    void StrokeLine(BPoint to);
    void StrokeRect(BRect rect);
    void FillRect(BRect rect);
    // As FillRect, in the low colour.
    void FillRectLow(BRect rect);
    void FillRoundRect(BRect rect, float xRadius, float yRadius);
    void StrokeEllipse(BPoint center, float xRadius, float yRadius);
    void FillEllipse(BPoint center, float xRadius, float yRadius);
    // Angles in degrees, counter-clockwise from three o'clock. A filled arc is a slice from the centre; a
    // stroked arc is the curve alone.
    void StrokeArc(BPoint center, float xRadius, float yRadius, float startAngle, float sweep);
    void FillArc(BPoint center, float xRadius, float yRadius, float startAngle, float sweep);
    // The text's baseline starts at point (without one: at the pen, which moves to the text's end).
    void DrawString(const char* text, BPoint point);
    void DrawString(const char* text);
    // Draws the source part of the bitmap into the target rectangle, scaled when the sizes differ. In
    // B_OP_OVER transparent pixels leave what is below; in B_OP_COPY they are drawn in the low colour.
    void DrawBitmap(const BBitmap* bitmap, BRect source, BRect target);
    void DrawBitmap(const BBitmap* bitmap, BPoint leftTop);

    virtual void Invalidate();
    virtual void Invalidate(BRect rect);

  protected:
    // For the layer's controls, which bring a widget of their own.
    BView(BRect frame, const char* name, uint32 resizingMode, uint32 flags, std::unique_ptr<ViewPeer> peer);
    [[nodiscard]] ViewPeer* Peer() const { return peer_.get(); }

  private:
    friend class BWindow;
    friend struct ViewAccess;

    void EnterWindow(BWindow* window);
    void LeaveWindow();
    void ParentResized(float dx, float dy);
    void PlaceWidget();

    BView* parent_ = nullptr;
    BWindow* window_ = nullptr;
    std::vector<std::unique_ptr<BView>> children_;
    BRect frame_;
    BPoint origin_;
    uint32 resizingMode_;
    uint32 flags_;
    int32 hideCount_ = 0;
    bool focusWanted_ = false;

    rgb_color viewColor_{255, 255, 255, 255};
    rgb_color highColor_{0, 0, 0, 255};
    rgb_color lowColor_{255, 255, 255, 255};
    drawing_mode drawingMode_ = B_OP_COPY;
    float penSize_ = 1;
    BPoint pen_;
    BFont font_;
    BRegion clipping_;
    bool clipped_ = false;

    std::unique_ptr<ViewPeer> peer_;
};
