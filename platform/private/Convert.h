#pragma once

// Between the layer's value types and the toolkit's. Only for the layer's own sources.

#include <QColor>
#include <QFont>
#include <QImage>
#include <QPointF>
#include <QRectF>

#include "platform/Bitmap.h"
#include "platform/Font.h"
#include "platform/Rect.h"

// Our rectangles name their last pixel, the toolkit's the edge behind it.
inline QRectF ToQt(const BRect& rect) {
    return {QPointF(rect.left, rect.top), QPointF(rect.right + 1, rect.bottom + 1)};
}
inline BRect FromQt(const QRectF& rect) {
    return {static_cast<float>(rect.left()), static_cast<float>(rect.top()),
            static_cast<float>(rect.right() - 1), static_cast<float>(rect.bottom() - 1)};
}
inline QPointF ToQt(const BPoint& point) {
    return {point.x, point.y};
}
inline BPoint FromQt(const QPointF& point) {
    return {static_cast<float>(point.x()), static_cast<float>(point.y())};
}
inline QColor ToQt(rgb_color color) {
    return {color.red, color.green, color.blue, color.alpha};
}

struct FontAccess {
    // In the nearest whole size; Scale tells by how much it differs from the font's own.
    static QFont ToQt(const BFont& font);
    static float Scale(const BFont& font);
    // The application object makes the three system fonts and deletes them at its end.
    static void MakeSystemFonts();
    static void DeleteSystemFonts();
};

struct BitmapAccess {
    static const QImage& Image(const BBitmap& bitmap);
};
