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
    Widget(this)->setAlignment(Qt::AlignLeft | Qt::AlignAbsolute | Qt::AlignVCenter);
    BStringView::SetHighColor(HighColor());
    SetText(text);
}

void BStringView::SetText(const char* text) {
    text_ = text ? text : "";
    Widget(this)->setText(QString::fromUtf8(text_));
}

// The text is on the background that the parent view paints, whatever the desktop's theme.
void BStringView::SetHighColor(rgb_color color) {
    BView::SetHighColor(color);
    QPalette palette = Widget(this)->palette();
    palette.setColor(QPalette::WindowText, ToQt(color));
    Widget(this)->setPalette(palette);
}
