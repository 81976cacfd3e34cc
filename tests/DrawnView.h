#pragma once

#include <algorithm>
#include <string>
#include <vector>

#include <QtWidgets>
#include <gtest/gtest.h>

#include "platform/View.h"
#include "platform/ViewPicture.h"

// What a view writes: a run of letters that lie side by side, where its ink is, how large its letters are,
// and whether all of it can be seen.
struct Written {
    std::string text;
    QRectF box;
    double size;
    bool whole;
};

// A surface that keeps the texts that a widget writes on it, and nothing else.
class TextRecorder : public QPaintEngine, public QImage {
  public:
    explicit TextRecorder(QWidget* widget) : QPaintEngine(AllFeatures), QImage(widget->size(), Format_RGB32) {
        widget->render(this);
    }
    std::vector<Written> written;

    void drawTextItem(const QPointF& at, const QTextItem& item) override {
        const QTransform place = painter()->combinedTransform();
        const QRectF ink = QFontMetricsF(item.font()).tightBoundingRect(item.text());
        if (ink.isEmpty())
            return;
        const QRectF box = place.mapRect(QRectF(at.x(), at.y() + ink.top(), item.width(), ink.height()));
        QRectF seen = rect();
        if (painter()->hasClipping())
            seen &= place.mapRect(painter()->clipBoundingRect());
        const bool whole = seen.marginsAdded({0.5, 0.5, 0.5, 0.5}).contains(box); // but for a blurred edge
        written.push_back({item.text().toStdString(), box, item.font().pixelSize() * place.m22(), whole});
    }
    bool begin(QPaintDevice*) override { return true; }
    bool end() override { return true; }
    void updateState(const QPaintEngineState&) override {}
    void drawPath(const QPainterPath&) override {}
    void drawPolygon(const QPointF*, int, PolygonDrawMode) override {}
    void drawPixmap(const QRectF&, const QPixmap&, const QRectF&) override {}
    [[nodiscard]] Type type() const override { return User; }
    [[nodiscard]] QPaintEngine* paintEngine() const override { return const_cast<TextRecorder*>(this); }
};

// What the view of a name, of which there is only one, writes, in the order it is drawn.
inline std::vector<Written> TextsIn(const char* view) {
    for (QWidget* widget : QApplication::allWidgets())
        if (widget->objectName() == view)
            return TextRecorder(widget).written;
    return {};
}

// That all of these texts can be read: none is cut, lies on another or is smaller than `least`.
inline void ExpectReadable(const std::vector<Written>& texts, double least) {
    for (std::size_t i = 0; i < texts.size(); ++i) {
        EXPECT_TRUE(texts[i].whole && texts[i].size >= least) << texts[i].text << ", " << texts[i].size;
        for (std::size_t k = 0; k < i; ++k)
            EXPECT_FALSE(texts[i].box.intersects(texts[k].box)) << texts[i].text << ", " << texts[k].text;
    }
}

// What the view writes, each text with a bar behind it.
inline std::string Texts(const BView& view) {
    std::string all;
    for (const Written& each : TextsIn(view.Name()))
        all += each.text + '|';
    return all;
}

// The view's pixels.
struct Picture : QImage {
    explicit Picture(BView& view) {
        loadFromData(QByteArray::fromStdString(DrawPicture(&view, PictureFormat::Png)));
    }
    [[nodiscard]] rgb_color At(BPoint point) const {
        const QRgb color = pixel(static_cast<int>(point.x), static_cast<int>(point.y));
        const auto part = [color](int shift) { return static_cast<uint8>(color >> shift); };
        return {part(16), part(8), part(0), 255};
    }
    // Near the point.
    [[nodiscard]] bool Has(BPoint point, rgb_color color) const {
        bool has = false;
        for (int i = 0; i < 42; ++i)
            has |= At(point + BPoint(static_cast<float>(i % 6 - 3), static_cast<float>(i / 6 - 3))) == color;
        return has;
    }
};
