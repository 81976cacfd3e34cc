#pragma once

class BView;
struct BRect;

// How Banner draws its bar and places its text. Of the three placements the first one given counts, in this
// order; without any the text is left-aligned.
inline constexpr short BannerInverse = 0x02; // white text on a black bar; otherwise black on white
inline constexpr short BannerRight = 0x04;
inline constexpr short BannerLeft = 0x08;
inline constexpr short BannerCenter = 0x10;
inline constexpr short BannerRounded = 0x20; // corners of radius 20

// Fills rect as a bar and draws the text in it, centred between top and bottom and cut at the bar's edges, in
// the view's font. The view's high colour is the text's afterwards. To be called inside the view's Draw.
void Banner(BView* view, const char* text, const BRect* rect, short flags);
