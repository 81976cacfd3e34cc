#pragma once

#include "platform/Font.h"

// The desktop's fonts as another person has them, of this size in pixels. Needs an application object.
struct SystemFonts {
    explicit SystemFonts(float size) {
        for (BFont* font : {&plain, &fixed})
            font->SetSize(size);
        be_plain_font = &plain;
        be_fixed_font = &fixed;
    }
    ~SystemFonts() {
        be_plain_font = wasPlain;
        be_fixed_font = wasFixed;
    }
    SystemFonts(const SystemFonts&) = delete;
    SystemFonts& operator=(const SystemFonts&) = delete;

    const BFont* wasPlain = be_plain_font;
    const BFont* wasFixed = be_fixed_font;
    BFont plain = *be_plain_font, fixed = *be_fixed_font;
};
