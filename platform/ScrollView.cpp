#include "platform/ScrollView.h"

#include "platform/ListView.h"
#include "platform/private/ListPeer.h"

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
