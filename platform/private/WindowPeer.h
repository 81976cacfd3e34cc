#pragma once

#include <QPointer>
#include <QWidget>

#include "platform/Window.h"

// The widget of a window: passes on what the window manager and the keyboard say.
class WindowWidget : public QWidget {
    Q_DISABLE_COPY_MOVE(WindowWidget)

  public:
    explicit WindowWidget(BWindow* owner) : owner_(owner) {}

  protected:
    void closeEvent(QCloseEvent* event) override;
    void changeEvent(QEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;
    void keyPressEvent(QKeyEvent* event) override;

  private:
    BWindow* owner_;
};

// What a window has on the toolkit's side.
struct WindowPeer {
    explicit WindowPeer(BWindow* owner) : widget(new WindowWidget(owner)) {}
    ~WindowPeer() { delete widget; }
    WindowPeer(const WindowPeer&) = delete;
    WindowPeer& operator=(const WindowPeer&) = delete;

    QPointer<WindowWidget> widget;
    QPointer<QWidget> activeBefore; // for a modal window: where the keyboard was
    BButton* defaultButton = nullptr;
    bool modal = false;
    bool resizable = true;
    bool shownBefore = false;
    bool placed = false; // with the frame that the window manager has drawn
};

// The layer's own way into windows.
struct WindowAccess {
    static WindowPeer* Peer(const BWindow* window) { return window->peer_.get(); }
    static QWidget* Widget(const BWindow* window) { return window->peer_->widget; }
    static void ContentResized(BWindow* window, float width, float height);
    static void Activated(BWindow* window);
};
