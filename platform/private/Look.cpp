#include "platform/private/Look.h"

#include <QApplication>
#include <QPalette>

// The style, too: some paint in the theme's colours whatever the palette says.
void SetLook() {
    QPalette palette(QColor(240, 240, 240), QColor(216, 216, 216));
    palette.setColor(QPalette::Highlight, QColor(0, 0, 128));
    palette.setColor(QPalette::HighlightedText, Qt::white);
    QApplication::setStyle(QStringLiteral("Fusion"));
    QApplication::setPalette(palette);
}
