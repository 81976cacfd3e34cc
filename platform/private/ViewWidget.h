#pragma once

#include <QWidget>

#include "platform/Message.h"

class BView;
struct BRect;

// The widget of a plain view: it paints by calling the view's Draw, and hands presses to the view's window as
// messages, so that they wait their turn like everything else.
class ViewWidget : public QWidget {
    Q_DISABLE_COPY_MOVE(ViewWidget)

  public:
    explicit ViewWidget(BView* owner) : owner_(owner) {}

    [[nodiscard]] BView* Owner() const { return owner_; }

  protected:
    bool event(QEvent* event) override;
    void paintEvent(QPaintEvent* event) override;
    void keyPressEvent(QKeyEvent* event) override;
    void mousePressEvent(QMouseEvent* event) override;
    void mouseMoveEvent(QMouseEvent* event) override;
    void mouseReleaseEvent(QMouseEvent* event) override;

  private:
    void TellAccessibility();
    void NotePointer(const QMouseEvent& event);
    void PostPointerMessage(const QMouseEvent& event, uint32 code);
    void TellMove(uint32 transit);

    BView* owner_;
    int markedPart_ = -1; // of the view's parts, as far as assistive technology knows
};

// What pointer hooks are called by.
constexpr uint32 MouseDownCode = message_code("_MDN");
constexpr uint32 MouseUpCode = message_code("_MUP");

// Draws that part of view, whose (0, 0) is the painter's origin, and of the views in it that are not hidden.
// Controls draw themselves.
void DrawTree(BView* view, QPainter& painter, const BRect& part);
