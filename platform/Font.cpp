#include "platform/Font.h"

#include <algorithm>
#include <cmath>

#include <QFontDatabase>
#include <QFontInfo>
#include <QFontMetricsF>
#include <QGuiApplication>

#include "platform/private/Convert.h"

// A font as the toolkit knows it, with its measures taken once: rows ask for them by the thousand.
struct FontFace {
    FontFace(const QFont& f, float wanted)
        : font(f), metrics(f), size(wanted), scale(wanted / static_cast<float>(f.pixelSize())) {
        height.ascent = static_cast<float>(metrics.ascent()) * scale;
        height.descent = static_cast<float>(metrics.descent()) * scale;
        height.leading = static_cast<float>(metrics.leading()) * scale;
    }

    QFont font;
    QFontMetricsF metrics;
    float size;
    float scale; // what the toolkit's font, whose pixels are whole, is drawn with
    font_height height;
};

const BFont* be_plain_font = nullptr;
const BFont* be_bold_font = nullptr;
const BFont* be_fixed_font = nullptr;

namespace {

// Sizes are pixels throughout, so that a printed page can be drawn by scaling the painter.
std::shared_ptr<const FontFace> MakeFace(QFont font, float size) {
    size = std::max(size, 1.0F);
    font.setPixelSize(static_cast<int>(std::lround(size)));
    return std::make_shared<const FontFace>(font, size);
}

} // namespace

QFont FontAccess::ToQt(const BFont& font) {
    return font.face_->font;
}

float FontAccess::Scale(const BFont& font) {
    return font.face_->scale;
}

void FontAccess::MakeSystemFonts() {
    const QFont plain = QGuiApplication::font();
    const auto size = static_cast<float>(QFontInfo(plain).pixelSize());
    QFont bold = plain;
    bold.setBold(true);
    be_plain_font = new BFont(MakeFace(plain, size));
    be_bold_font = new BFont(MakeFace(bold, size));
    be_fixed_font = new BFont(MakeFace(QFontDatabase::systemFont(QFontDatabase::FixedFont), size));
}

void FontAccess::DeleteSystemFonts() {
    for (const BFont** font : {&be_plain_font, &be_bold_font, &be_fixed_font}) {
        delete *font;
        *font = nullptr;
    }
}

BFont::BFont() : face_(be_plain_font->face_) {}

float BFont::Size() const {
    return face_->size;
}

void BFont::SetSize(float size) {
    face_ = MakeFace(face_->font, size);
}

void BFont::GetHeight(font_height* height) const {
    *height = face_->height;
}

float BFont::StringWidth(const char* text) const {
    return static_cast<float>(face_->metrics.horizontalAdvance(QString::fromUtf8(text))) * face_->scale;
}
