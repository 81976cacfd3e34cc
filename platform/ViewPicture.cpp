#include "platform/ViewPicture.h"

#include <algorithm>
#include <cmath>

#include <QBuffer>
#include <QClipboard>
#include <QGuiApplication>
#include <QImage>
#include <QPageSize>
#include <QPainter>
#include <QPdfWriter>
#include <QSvgGenerator>

#include "platform/View.h"
#include "platform/private/Convert.h"
#include "platform/private/ViewWidget.h"

namespace {

constexpr int PointsPerInch = 72;
constexpr float MaxScale = 16;

QSize SizeOf(const BView* view) {
    const BRect bounds = view->Bounds();
    return {static_cast<int>(std::ceil(bounds.Width())) + 1,
            static_cast<int>(std::ceil(bounds.Height())) + 1};
}

// For who does not see the picture.
QString NameOf(const BView* view) {
    return QString::fromStdString(view->AccessibleName());
}

QString DescriptionOf(const BView* view) {
    return NameOf(view) + QLatin1Char('\n') + QString::fromStdString(view->AccessibleDescription());
}

bool Paint(BView* view, QPaintDevice* device, double scale) {
    QPainter painter;
    if (!painter.begin(device))
        return false;
    painter.scale(scale, scale);
    painter.fillRect(QRect(QPoint(0, 0), SizeOf(view)), ToQt(view->ViewColor())); // to the last whole pixel
    painter.translate(-ToQt(view->Bounds().LeftTop()));
    DrawTree(view, painter, view->Bounds());
    return painter.end();
}

bool WritePng(BView* view, QBuffer& file, float scale) {
    QImage image(SizeOf(view) * std::clamp(scale, 1 / MaxScale, MaxScale), QImage::Format_RGB32);
    if (image.isNull())
        return false;
    image.setText(QStringLiteral("Title"), NameOf(view));
    image.setText(QStringLiteral("Description"), DescriptionOf(view));
    return Paint(view, &image, std::clamp(scale, 1 / MaxScale, MaxScale)) && image.save(&file, "PNG");
}

bool WriteSvg(BView* view, QBuffer& file) {
    QSvgGenerator svg;
    svg.setOutputDevice(&file);
    svg.setResolution(PointsPerInch);
    svg.setSize(SizeOf(view));
    svg.setViewBox(QRect(QPoint(0, 0), SizeOf(view)));
    // The generator writes these as they are given.
    svg.setTitle(NameOf(view).toHtmlEscaped());
    svg.setDescription(DescriptionOf(view).toHtmlEscaped());
    return Paint(view, &svg, 1);
}

bool WritePdf(BView* view, QBuffer& file) {
    QPdfWriter pdf(&file);
    pdf.setResolution(PointsPerInch);
    pdf.setTitle(NameOf(view));
    pdf.setPageSize(QPageSize(QSizeF(SizeOf(view)), QPageSize::Point, QString(), QPageSize::ExactMatch));
    pdf.setPageMargins(QMarginsF());
    return Paint(view, &pdf, 1);
}

} // namespace

std::string DrawPicture(BView* view, PictureFormat format, float scale) {
    QBuffer file;
    file.open(QIODevice::WriteOnly);
    const bool written = format == PictureFormat::Png   ? WritePng(view, file, scale)
                         : format == PictureFormat::Svg ? WriteSvg(view, file)
                                                        : WritePdf(view, file);
    return written ? file.data().toStdString() : std::string();
}

bool CopyPicture(const std::string& png) {
    const QImage picture = QImage::fromData(QByteArray::fromStdString(png), "PNG");
    if (!picture.isNull())
        QGuiApplication::clipboard()->setImage(picture);
    return !picture.isNull();
}
