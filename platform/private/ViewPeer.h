#pragma once

// What a view has on the toolkit's side. Only for the layer's own sources.

#include <mutex>

#include <QPainter>
#include <QPainterPath>
#include <QPointer>
#include <QWidget>

#include "platform/Menu.h"
#include "platform/View.h"

// Holds a view's widget, and the painter while a paint pass runs. Belongs to its view. The widget belongs to
// the toolkit's tree of widgets, which mirrors the tree of views; whoever of the two dies first, the pointer
// tells.
struct ViewPeer {
    // Takes the widget, which has no parent yet.
    explicit ViewPeer(QWidget* w) : widget(w) {}
    virtual ~ViewPeer() { delete widget; }
    ViewPeer(const ViewPeer&) = delete;
    ViewPeer& operator=(const ViewPeer&) = delete;

    // The widget that is drawn into and that children are put in: for a scrolling widget its viewport.
    virtual QWidget* Canvas() const { return widget; }

    QPointer<QWidget> widget;
    std::unique_ptr<BMenu> contextMenu;
    QPainter* painter = nullptr;
    // What the painter was limited to when the paint pass began.
    QPainterPath baseClip;
    bool hasBaseClip = false;

    std::mutex pointerMutex; // guards the two below, which watcher threads read
    BPoint pointer;
    uint32 buttons = 0;
};

// The layer's own way into views.
struct ViewAccess {
    static ViewPeer* Peer(const BView* view) { return view->peer_.get(); }
    static QWidget* Widget(const BView* view) { return view->peer_->widget; }
    // Of a control in several parts: the one that a person works.
    static QWidget* Worked(const BView* view);
    // The frame changed on the toolkit's side or by a control's own adjustment: takes it over without moving
    // widgets.
    static void SetFrame(BView* view, const BRect& frame);
    static void SetResizingMode(BView* view, uint32 mode) { view->resizingMode_ = mode; }
    // The painter of the paint pass under way; null, with a paint pass asked for, when there is none.
    static QPainter* Painter(BView* view);
    // Notes where the pointer is and which buttons are held, for GetMouse.
    static void NotePointer(BView* view, BPoint where, uint32 buttons);
};

// Opens a view for drawing with painter for as long as it lives: the painter's origin is taken as the view's
// (0, 0), its state is kept and restored. The view's drawing state is the view's own.
class PaintPass {
  public:
    PaintPass(BView* view, QPainter* painter);
    ~PaintPass();
    PaintPass(const PaintPass&) = delete;
    PaintPass& operator=(const PaintPass&) = delete;

  private:
    ViewPeer* peer_;
    QPainter* outer_;
};

// Buttons and modifier keys of a toolkit event as the layer's bits.
uint32 ButtonBits(Qt::MouseButtons buttons);
uint32 ModifierBits(Qt::KeyboardModifiers keys);
