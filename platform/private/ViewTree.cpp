#include "platform/private/ViewTree.h"

#include <QPainter>

#include "platform/View.h"
#include "platform/private/Convert.h"
#include "platform/private/ViewPeer.h"
#include "platform/private/ViewWidget.h"

void DrawTree(BView* view, QPainter& painter, const BRect& part) {
    auto* plain = dynamic_cast<ViewWidget*>(ViewAccess::Widget(view));
    if (!plain) {
        const BPoint origin = view->Bounds().LeftTop();
        ViewAccess::Widget(view)->render(&painter,
                                         QPoint(static_cast<int>(origin.x), static_cast<int>(origin.y)),
                                         QRegion(), QWidget::DrawChildren);
        return;
    }
    painter.fillRect(ToQt(part), ToQt(view->ViewColor()));
    {
        const PaintPass pass(view, &painter);
        view->Draw(part);
    }
    for (int32 index = 0; BView* child = view->ChildAt(index); index++) {
        const BPoint shift = child->Frame().LeftTop() - child->Bounds().LeftTop();
        BRect inner = part & child->Frame();
        if (child->IsHidden() || !inner.IsValid())
            continue;
        painter.save();
        painter.setClipRect(ToQt(inner), Qt::IntersectClip);
        painter.translate(ToQt(shift));
        inner.OffsetBy(-shift.x, -shift.y);
        DrawTree(child, painter, inner);
        painter.restore();
    }
}
