#include "platform/Bitmap.h"

#include <algorithm>
#include <cstring>

#include <QImage>

#include "platform/private/Convert.h"

struct BitmapPixels {
    QImage image;
};

namespace {

struct NamedEntry {
    uint8 index;
    rgb_color color;
};

// The entries that pictures of this program use, chosen to be told apart on white and on the selection's
// grey.
constexpr NamedEntry NamedEntries[] = {
    {0, {0, 0, 0, 255}},      {143, {0, 128, 24, 255}}, {163, {136, 72, 0, 255}},
    {191, {0, 48, 200, 255}}, {228, {204, 0, 0, 255}},  {252, {255, 208, 0, 255}},
};

constexpr uint8 Spread(int value, int steps) {
    return static_cast<uint8>(value * 255 / (steps - 1));
}

QList<QRgb> MakeColorTable() {
    QList<QRgb> table;
    for (int index = 0; index < 256; ++index)
        table.append(ToQt(color_map_entry(static_cast<uint8>(index))).rgba());
    return table;
}

} // namespace

rgb_color color_map_entry(uint8 index) {
    if (index == B_TRANSPARENT_MAGIC_CMAP8)
        return {255, 255, 255, 0};
    for (const NamedEntry& entry : NamedEntries)
        if (entry.index == index)
            return entry.color;
    // The rest is a plain cube: three bits of red, three of green, two of blue.
    return {Spread(index >> 5, 8), Spread((index >> 2) & 7, 8), Spread(index & 3, 4), 255};
}

const QImage& BitmapAccess::Image(const BBitmap& bitmap) {
    return bitmap.pixels_->image;
}

BBitmap::BBitmap(BRect bounds, color_space) : bounds_(bounds), pixels_(std::make_unique<BitmapPixels>()) {
    const int width = std::max(1, static_cast<int>(bounds.Width()) + 1);
    const int height = std::max(1, static_cast<int>(bounds.Height()) + 1);
    pixels_->image = QImage(width, height, QImage::Format_Indexed8);
    pixels_->image.setColorTable(MakeColorTable());
    pixels_->image.fill(B_TRANSPARENT_MAGIC_CMAP8);
}

BBitmap::~BBitmap() = default;

void BBitmap::SetBits(const void* data, int32 length, int32 offset, color_space) {
    if (length < 0 || offset < 0)
        return;
    QImage& image = pixels_->image;
    const int rowBytes = image.width();
    const auto* source = static_cast<const uchar*>(data);
    const auto end = static_cast<int32>(std::min(int64{offset} + length, int64{rowBytes} * image.height()));
    for (int32 at = offset; at < end;) {
        const int column = at % rowBytes;
        const int count = std::min(rowBytes - column, end - at);
        std::memcpy(image.scanLine(at / rowBytes) + column, source, static_cast<std::size_t>(count));
        source += count;
        at += count;
    }
}
