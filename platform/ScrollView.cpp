#include "platform/ScrollView.h"

#include <QScrollBar>

#include "platform/ListView.h"
#include "platform/private/ListPeer.h"

namespace {

BRect FrameAround(const BListView& target, bool horizontal, bool vertical) {
    BRect frame = target.Frame();
    if (vertical)
        frame.right += B_V_SCROLL_BAR_WIDTH;
    if (horizontal)
        frame.bottom += B_H_SCROLL_BAR_HEIGHT;
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

QScrollBar* Bar(BListView* target, orientation direction) {
    RowsWidget* rows = ListAccess::Peer(*target).Rows();
    return direction == B_HORIZONTAL ? rows->horizontalScrollBar() : rows->verticalScrollBar();
}

} // namespace

BScrollBar::BScrollBar(BListView* target, orientation direction) : target_(target), orientation_(direction) {}

float BScrollBar::Value() const {
    return static_cast<float>(Bar(target_, orientation_)->value());
}

void BScrollBar::SetValue(float value) {
    Bar(target_, orientation_)->setValue(static_cast<int>(value));
}

void BScrollBar::GetRange(float* minimum, float* maximum) const {
    *minimum = static_cast<float>(Bar(target_, orientation_)->minimum());
    *maximum = static_cast<float>(Bar(target_, orientation_)->maximum());
}

BScrollView::BScrollView(const char* name, BListView* target, uint32 resizingMode, uint32 flags,
                         bool horizontal, bool vertical, border_style border)
    : BView(FrameAround(*target, horizontal, vertical), name, resizingMode, flags & ~B_NAVIGABLE),
      target_(target) {
    if (horizontal)
        horizontal_.reset(new BScrollBar(target, B_HORIZONTAL));
    if (vertical)
        vertical_.reset(new BScrollBar(target, B_VERTICAL));
    RowsWidget* rows = ListAccess::Peer(*target).Rows();
    rows->SetBars(horizontal, vertical);
    rows->setFrameShape(ShapeOf(border));
    ViewAccess::SetResizingMode(target, B_FOLLOW_ALL_SIDES);
    AddChild(target);
    SetTopMargin(0);
}

BScrollView::~BScrollView() = default;

BScrollBar* BScrollView::ScrollBar(orientation direction) const {
    return direction == B_HORIZONTAL ? horizontal_.get() : vertical_.get();
}

void BScrollView::SetTopMargin(float height) {
    target_->MoveTo(0, height);
    target_->ResizeTo(Frame().Width(), Frame().Height() - height);
}
