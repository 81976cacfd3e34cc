// The drawing calls of BView: each draws with the painter of the paint pass under way, and asks for one when
// there is none.

#include <algorithm>
#include <cmath>

#include <QPainter>
#include <QPainterPath>

#include "platform/View.h"
#include "platform/private/Convert.h"
#include "platform/private/ViewPeer.h"

namespace {

// What a straight line covers. It runs through the middle of pixels, or between two when its width is even.
QRectF StraightLine(BPoint from, BPoint to, float width) {
    const double half = width / 2;
    const double offset = std::fmod(width, 2.0F) == 0 ? 0.0 : 0.5;
    return QRectF(ToQt(from), ToQt(to))
        .normalized()
        .translated(offset, offset)
        .adjusted(-half, -half, half, half);
}

// Fills to whole pixels of the device, so that areas with a common edge leave no seam where a logical pixel
// is no whole number of the device's. Where it is less than one of them, thin areas would vanish that way.
void Fill(QPainter& painter, const QRectF& area, rgb_color color) {
    painter.setRenderHint(QPainter::Antialiasing, painter.deviceTransform().m11() < 1);
    painter.fillRect(area, ToQt(color));
    painter.setRenderHint(QPainter::Antialiasing);
}

// The part of the image with every pixel made a square of at least as many as the device has for it, so that
// only what is left over is smoothed: pixels keep their edges at any density.
QImage Enlarged(const QImage& image, const QRect& part, double devicePixels) {
    constexpr double most = 16;
    const int whole = static_cast<int>(std::ceil(std::clamp(devicePixels, 1.0, most)));
    return image.copy(part).scaled(part.size() * whole);
}

QRectF EllipseRect(BPoint center, float xRadius, float yRadius) {
    return {center.x + 0.5 - xRadius, center.y + 0.5 - yRadius, 2.0 * xRadius, 2.0 * yRadius};
}

} // namespace

PaintPass::PaintPass(BView* view, QPainter* painter) : peer_(ViewAccess::Peer(view)), outer_(peer_->painter) {
    painter->save();
    painter->setRenderHints(QPainter::Antialiasing | QPainter::TextAntialiasing |
                            QPainter::SmoothPixmapTransform);
    peer_->painter = painter;
    peer_->hasBaseClip = painter->hasClipping();
    if (peer_->hasBaseClip)
        peer_->baseClip = painter->clipPath();
    view->ConstrainClippingRegion(nullptr);
}

PaintPass::~PaintPass() {
    peer_->painter->restore();
    peer_->painter = outer_;
}

QPainter* ViewAccess::Painter(BView* view) {
    QPainter* painter = view->peer_->painter;
    if (!painter)
        view->Invalidate();
    return painter;
}

void BView::ConstrainClippingRegion(const BRegion* region) {
    clipped_ = region != nullptr;
    clipping_ = region ? *region : BRegion();
    QPainter* painter = peer_->painter;
    if (!painter)
        return;
    if (peer_->hasBaseClip)
        painter->setClipPath(peer_->baseClip);
    else
        painter->setClipping(false);
    if (!region)
        return;
    const QRectF area = region->Frame().IsValid() ? ToQt(region->Frame()) : QRectF();
    painter->setClipRect(area, peer_->hasBaseClip ? Qt::IntersectClip : Qt::ReplaceClip);
}

void BView::GetClippingRegion(BRegion* region) const {
    if (clipped_)
        *region = clipping_;
    else
        region->Set(Bounds());
}

void BView::StrokeLine(BPoint from, BPoint to) {
    pen_ = to;
    if (QPainter* painter = ViewAccess::Painter(this)) {
        if (from.x == to.x || from.y == to.y) {
            Fill(*painter, StraightLine(from, to, penSize_), highColor_);
            return;
        }
        painter->setPen(QPen(ToQt(highColor_), penSize_, Qt::SolidLine, Qt::RoundCap));
        painter->drawLine(ToQt(from) + QPointF(0.5, 0.5), ToQt(to) + QPointF(0.5, 0.5));
    }
}

void BView::StrokeLine(BPoint to) {
    StrokeLine(pen_, to);
}

// Four filled strips, since the painter leaves the corners of a smooth outline pale.
void BView::StrokeRect(BRect rect) {
    if (QPainter* painter = ViewAccess::Painter(this)) {
        const QRectF outer = ToQt(rect);
        const double pen = penSize_;
        const double inner = outer.height() - 2 * pen;
        Fill(*painter, QRectF(outer.left(), outer.top(), outer.width(), pen), highColor_);
        Fill(*painter, QRectF(outer.left(), outer.bottom() - pen, outer.width(), pen), highColor_);
        Fill(*painter, QRectF(outer.left(), outer.top() + pen, pen, inner), highColor_);
        Fill(*painter, QRectF(outer.right() - pen, outer.top() + pen, pen, inner), highColor_);
    }
}

void BView::FillRect(BRect rect) {
    if (QPainter* painter = ViewAccess::Painter(this))
        Fill(*painter, ToQt(rect), highColor_);
}

void BView::FillRectLow(BRect rect) {
    if (QPainter* painter = ViewAccess::Painter(this))
        Fill(*painter, ToQt(rect), lowColor_);
}

void BView::FillRoundRect(BRect rect, float xRadius, float yRadius) {
    if (QPainter* painter = ViewAccess::Painter(this)) {
        painter->setPen(Qt::NoPen);
        painter->setBrush(ToQt(highColor_));
        painter->drawRoundedRect(ToQt(rect), xRadius, yRadius);
    }
}

void BView::StrokeEllipse(BPoint center, float xRadius, float yRadius) {
    if (QPainter* painter = ViewAccess::Painter(this)) {
        painter->setPen(QPen(ToQt(highColor_), penSize_));
        painter->setBrush(Qt::NoBrush);
        painter->drawEllipse(EllipseRect(center, xRadius, yRadius));
    }
}

void BView::FillEllipse(BPoint center, float xRadius, float yRadius) {
    if (QPainter* painter = ViewAccess::Painter(this)) {
        painter->setPen(Qt::NoPen);
        painter->setBrush(ToQt(highColor_));
        painter->drawEllipse(EllipseRect(center, xRadius, yRadius));
    }
}

void BView::StrokeArc(BPoint center, float xRadius, float yRadius, float startAngle, float sweep) {
    if (QPainter* painter = ViewAccess::Painter(this)) {
        // A path takes the angles as they are; the painter's own arc calls round them to sixteenths of a
        // degree.
        const QRectF ellipse = EllipseRect(center, xRadius, yRadius);
        QPainterPath path;
        path.arcMoveTo(ellipse, startAngle);
        path.arcTo(ellipse, startAngle, sweep);
        painter->setPen(QPen(ToQt(highColor_), penSize_, Qt::SolidLine, Qt::FlatCap));
        painter->setBrush(Qt::NoBrush);
        painter->drawPath(path);
    }
}

void BView::FillArc(BPoint center, float xRadius, float yRadius, float startAngle, float sweep) {
    if (QPainter* painter = ViewAccess::Painter(this)) {
        const QRectF ellipse = EllipseRect(center, xRadius, yRadius);
        QPainterPath path(ellipse.center());
        path.arcTo(ellipse, startAngle, sweep);
        path.closeSubpath();
        painter->setPen(Qt::NoPen);
        painter->setBrush(ToQt(highColor_));
        painter->drawPath(path);
    }
}

void BView::DrawString(const char* text, BPoint point) {
    pen_ = {point.x + font_.StringWidth(text), point.y};
    if (QPainter* painter = ViewAccess::Painter(this)) {
        painter->setFont(FontAccess::ToQt(font_));
        painter->setPen(ToQt(highColor_));
        const QTransform whole = painter->transform();
        painter->translate(ToQt(point));
        painter->scale(FontAccess::Scale(font_), FontAccess::Scale(font_));
        painter->drawText(QPointF(), QString::fromUtf8(text));
        painter->setTransform(whole);
    }
}

void BView::DrawString(const char* text) {
    DrawString(text, pen_);
}

void BView::DrawBitmap(const BBitmap* bitmap, BRect source, BRect target) {
    QPainter* painter = ViewAccess::Painter(this);
    if (!painter || !bitmap || !source.IsValid())
        return;
    if (drawingMode_ == B_OP_COPY)
        Fill(*painter, ToQt(target), lowColor_);
    const QRectF place = ToQt(target);
    const QRect part = ToQt(source).toAlignedRect();
    const double devicePixels = painter->deviceTransform().m11() * place.width() / part.width();
    painter->drawImage(place, Enlarged(BitmapAccess::Image(*bitmap), part, devicePixels));
}

void BView::DrawBitmap(const BBitmap* bitmap, BPoint leftTop) {
    if (!bitmap)
        return;
    BRect target = bitmap->Bounds();
    target.OffsetTo(leftTop.x, leftTop.y);
    DrawBitmap(bitmap, bitmap->Bounds(), target);
}
