#pragma once

#include "platform/Looper.h"
#include "platform/Rect.h"

class BButton;
class BView;
struct WindowPeer;

enum window_look { B_DOCUMENT_WINDOW_LOOK, B_FLOATING_WINDOW_LOOK };
enum window_feel { B_NORMAL_WINDOW_FEEL, B_MODAL_APP_WINDOW_FEEL };
// A look and a feel in one.
enum window_type { B_DOCUMENT_WINDOW };

constexpr uint32 B_NOT_ZOOMABLE = 0x0040;
constexpr uint32 B_NOT_RESIZABLE = 0x0002;
constexpr uint32 B_WILL_ACCEPT_FIRST_CLICK = 0x0010;

// A window with its looper. It is created hidden with new, shown with Show, and deletes itself in Quit. It
// belongs to the application's list of windows until then, owns the views added to it, and is used on the
// interface thread with its lock held (the constructor's thread has it until Show). It opens wholly on the
// free part of its screen, moved or made smaller where it must be.
//
// The close box posts B_QUIT_REQUESTED to the window, and so does the Escape key in a window with the feel
// B_MODAL_APP_WINDOW_FEEL, which also keeps the person out of the application's other windows while it is
// shown.
class BWindow : public BLooper {
  public:
    // frame is the window's content in screen coordinates. With the floating look it becomes as wide as its
    // title needs to be read.
    BWindow(BRect frame, const char* title, window_type type, uint32 flags);
    BWindow(BRect frame, const char* title, window_look look, window_feel feel, uint32 flags);
    ~BWindow() override;

    // Takes ownership of the view.
    void AddChild(BView* child);
    [[nodiscard]] BView* FindView(const char* name) const;

    [[nodiscard]] const char* Title() const { return Name(); }

    // What the window is called by who does not see it; the title at first.
    void SetAccessibleName(const char* name);

    // Frame is in screen coordinates; Bounds is the same size at (0, 0).
    [[nodiscard]] BRect Frame() const;
    [[nodiscard]] BRect Bounds() const;
    // The frame, or while the window fills its screen the one that it goes back to.
    [[nodiscard]] BRect UnzoomedFrame() const;
    // The part of the screen at this place that a window's content can fill.
    [[nodiscard]] static BRect RoomAt(BPoint where);
    void MoveTo(float x, float y);
    void MoveBy(float dx, float dy);
    void ResizeTo(float width, float height);
    // Limits of Width() and Height() that the person can give the window.
    void SetSizeLimits(float minWidth, float maxWidth, float minHeight, float maxHeight);

    // Showing the first time unlocks the constructor's lock, as the window starts to serve its queue.
    virtual void Show();
    virtual void Hide();
    [[nodiscard]] bool IsHidden() const;
    void Activate();

    // The button that Enter presses wherever the focus is, save on another button. Null for none.
    void SetDefaultButton(BButton* button);

    // Paints what waits to be painted, now; allowed while a handler of this window waits.
    void UpdateIfNeeded();

    // Called before a menu of the window's menu bar opens, to enable and mark its items.
    virtual void MenusBeginning() {}
    // The window was moved or resized by the person or the system.
    virtual void FrameResized(float width, float height);

    void Quit() override;

  protected:
    void DispatchMessage(BMessage* message, BHandler* handler) override;

  private:
    friend class BView;
    friend struct WindowAccess;

    void PutOnScreen();

    std::unique_ptr<WindowPeer> peer_;
    std::unique_ptr<BView> content_;
};

// The main screen, as of the moment of the call. Interface thread.
class BScreen {
  public:
    // In logical pixels; the left top is (0, 0) on a single screen.
    [[nodiscard]] BRect Frame() const;
};
