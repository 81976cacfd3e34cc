#pragma once

#include <utility>

#include <QtGlobal>

#include "platform/Font.h"

// The desktop's fonts as another person has them, of this size in pixels. Needs an application object.
struct SystemFonts {
    explicit SystemFonts(float size) {
        plain.SetSize(size);
        fixed.SetSize(size);
    }
    ~SystemFonts() {
        be_plain_font = wasPlain;
        be_fixed_font = wasFixed;
    }
    Q_DISABLE_COPY_MOVE(SystemFonts)

    BFont plain = *be_plain_font, fixed = *be_fixed_font;
    const BFont* const wasPlain = std::exchange(be_plain_font, &plain);
    const BFont* const wasFixed = std::exchange(be_fixed_font, &fixed);
};
