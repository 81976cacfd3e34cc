#include "platform/ScrollView.h"

#include <algorithm>

#include <QApplication>
#include <QScrollArea>

#include "platform/ListView.h"
#include "platform/private/ListPeer.h"
#include "platform/private/ViewPeer.h"

namespace {

constexpr float BarThickness = 14;

BRect FrameAround(const BListView& target, bool horizontal, bool vertical) {
    BRect frame = target.Frame();
    if (vertical)
        frame.right += BarThickness;
    if (horizontal)
        frame.bottom += BarThickness;
    return frame;
}

QFrame::Shape ShapeOf(border_style border) {
    switch (border) {
    case B_PLAIN_BORDER:
        return QFrame::Box;
    case B_FANCY_BORDER:
        return QFrame::StyledPanel;
    default:
        return QFrame::NoFrame;
    }
}

constexpr int Margin = 10; // below the last control

// What it holds is as wide as is seen, and as high as its controls are. Belongs to its view's peer.
class FormArea : public QScrollArea {
    Q_DISABLE_COPY_MOVE(FormArea)

  public:
    FormArea() {
        setFrameShape(NoFrame);
        setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
        setWidget(new QWidget);
        widget()->setAutoFillBackground(false);
        viewport()->setAutoFillBackground(false);
        connect(qApp, &QApplication::focusChanged, this, [this](QWidget*, QWidget* now) {
            if (now && widget()->isAncestorOf(now))
                ensureWidgetVisible(now);
        });
    }

  protected:
    void resizeEvent(QResizeEvent* event) override {
        const int controls = widget()->childrenRect().bottom() + 1 + Margin;
        widget()->resize(viewport()->width(), std::max(controls, viewport()->height()));
        QScrollArea::resizeEvent(event);
    }
};

struct FormPeer : ViewPeer {
    FormPeer() : ViewPeer(new FormArea) {}
    [[nodiscard]] QWidget* Canvas() const override { return static_cast<FormArea*>(widget.data())->widget(); }
};

} // namespace

BScrollView::BScrollView(const char* name, BListView* target, uint32 resizingMode, uint32 flags,
                         bool horizontal, bool vertical, border_style border)
    : BView(FrameAround(*target, horizontal, vertical), name, resizingMode, flags & ~B_NAVIGABLE),
      target_(target) {
    RowsWidget* rows = ListAccess::Peer(*target).Rows();
    rows->SetBars(horizontal, vertical);
    rows->setFrameShape(ShapeOf(border));
    ViewAccess::SetResizingMode(target, B_FOLLOW_ALL_SIDES);
    AddChild(target);
    SetTopMargin(0);
}

void BScrollView::SetTopMargin(float height) {
    target_->MoveTo(0, height);
    target_->ResizeTo(Frame().Width(), Frame().Height() - height);
}

BFormView::BFormView(BRect frame, const char* name, uint32 resizingMode)
    : BView(frame, name, resizingMode, B_WILL_DRAW, std::make_unique<FormPeer>()) {}
