#include "platform/StringView.h"

#include <QLabel>

#include "platform/private/Convert.h"
#include "platform/private/ViewPeer.h"

namespace {

QLabel* Widget(const BStringView* view) {
    return static_cast<QLabel*>(ViewAccess::Widget(view));
}

} // namespace

BStringView::BStringView(BRect frame, const char* name, const char* text, uint32 resizingMode, uint32 flags)
    : BView(frame, name, resizingMode, flags, std::make_unique<ViewPeer>(new QLabel)) {
    Widget(this)->setTextFormat(Qt::PlainText);
    SetAlignment(B_ALIGN_LEFT);
    BStringView::SetHighColor(HighColor());
    SetText(text);
}

void BStringView::SetText(const char* text) {
    text_ = text ? text : "";
    Widget(this)->setText(QString::fromUtf8(text_));
}

void BStringView::SetAlignment(alignment side) {
    const Qt::AlignmentFlag horizontal = side == B_ALIGN_LEFT    ? Qt::AlignLeft
                                         : side == B_ALIGN_RIGHT ? Qt::AlignRight
                                                                 : Qt::AlignHCenter;
    Widget(this)->setAlignment(horizontal | Qt::AlignAbsolute | Qt::AlignVCenter);
}

// The text is on the background that the parent view paints, whatever the desktop's theme.
void BStringView::SetHighColor(rgb_color color) {
    BView::SetHighColor(color);
    QPalette palette = Widget(this)->palette();
    palette.setColor(QPalette::WindowText, ToQt(color));
    Widget(this)->setPalette(palette);
}

void BStringView::SetFont(const BFont* font, uint32 properties) {
    BView::SetFont(font, properties);
    BFont whole;
    GetFont(&whole);
    Widget(this)->setFont(FontAccess::ToQt(whole));
}
