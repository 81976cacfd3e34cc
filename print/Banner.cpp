#include "print/Banner.h"

#include "platform/View.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr float CornerRadius = 20;

uint8 Placement(short flags) {
    if (flags & BannerRight)
        return DrawTextRight;
    if (flags & BannerLeft)
        return DrawTextLeft;
    return flags & BannerCenter ? DrawTextCenter : DrawTextLeft;
}

} // namespace

void Banner(BView* view, const char* text, const BRect* rect, short flags) {
    const bool inverse = (flags & BannerInverse) != 0;
    view->SetHighColor(inverse ? colors::black : colors::white);
    if (flags & BannerRounded)
        view->FillRoundRect(*rect, CornerRadius, CornerRadius);
    else
        view->FillRect(*rect);
    view->SetHighColor(inverse ? colors::white : colors::black);
    DrawText(view, rect, text, static_cast<uint8>(Placement(flags) | DrawTextMiddle));
}
