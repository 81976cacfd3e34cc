#pragma once

#include <string>

#include "platform/Alert.h"
#include "platform/Font.h"
#include "platform/Types.h"
#include "util/Strings.h"

class BApplication;
class BView;
class BWindow;
struct BPoint;
struct BRect;

// Small helpers over the platform layer that the whole program shares. They hold no state. Unless said
// otherwise they belong on the interface thread.

// The program's colours, all opaque. In a namespace, since names as short as these would shadow members and
// parameters everywhere.
namespace colors {
inline constexpr rgb_color light_gray{240, 240, 240, 255};
inline constexpr rgb_color gray{216, 216, 216, 255};
inline constexpr rgb_color white{255, 255, 255, 255};
inline constexpr rgb_color black{0, 0, 0, 255};
inline constexpr rgb_color dark_gray{120, 120, 120, 255};
inline constexpr rgb_color red{128, 0, 0, 255};
inline constexpr rgb_color green{0, 128, 0, 255};
inline constexpr rgb_color blue{0, 0, 128, 255};
inline constexpr rgb_color yellow{255, 255, 0, 255};
inline constexpr rgb_color magenta{128, 0, 128, 255};
} // namespace colors

// Where DrawText places its text: one horizontal and one vertical flag.
inline constexpr uint8 DrawTextLeft = 0x01;   // starts at the left edge
inline constexpr uint8 DrawTextCenter = 0x02; // centred between the sides
inline constexpr uint8 DrawTextRight = 0x04;  // ends 2 inside the right edge
inline constexpr uint8 DrawTextTop = 0x10;    // baseline one ascent below the top edge
inline constexpr uint8 DrawTextMiddle = 0x20; // centred between top and bottom
inline constexpr uint8 DrawTextBottom = 0x40; // baseline one descent above the bottom edge

// Shows the text with one button, "Ok", and waits until it is closed. Any thread.
void MessageBox(const char* text, alert_type type);

// Asks a question with the buttons "Yes" and "No" (the default). False for "Yes", true for "No" and for
// closing the question: callers go ahead only on false. Any thread.
[[nodiscard]] bool YesNoBox(const char* text);

// What the person is told when a data file or the network lets a command down. Each shows an alert and waits
// until it is closed. Any thread.

// A change could not be written to its file.
void TellNotSaved();
// A record could not be read: an investment, unless `what` says otherwise.
void TellNotRead(const char* what = "An investment");
// The network cannot be reached.
void TellNotConnected();
// A quote server's certificate was refused.
void TellNotTrusted(const char* host);

// Stores the folder that holds the program's executable, without a trailing "/". A path that does not fit
// gives the empty string and false: a cut one would be another folder. (For a program in the root folder the
// empty string is the answer, with true.) Any thread.
[[nodiscard]] bool GetHomeDir(char (&out)[PathBufferSize]);

// Fills the window with a grey view, for its controls, which the window owns.
BView* AddTopView(BWindow& window);

// The centre of the main screen.
void GetScreenCenter(BPoint* out);

void GetBRectCenter(const BRect* rect, BPoint* out);

// Ascent, descent and leading of the font, in logical pixels.
[[nodiscard]] float GetFontHeight(const BFont* font);

// The font, or where the text is wider in it than that, the largest in which it is not, down to the least
// size.
[[nodiscard]] BFont FittingFont(BFont font, const std::string& text, float width, float leastSize = 1);

// How many times wider than usual letters of the plain font are, and at least 1. What is laid out for the
// usual font is stretched by it, so that nothing is cut off in a larger one.
[[nodiscard]] float GetFontGrowth();

// The first of the application's windows with exactly this title; null when there is none. Waits at most 0.2
// s for each window's lock and passes over a window that it cannot lock in that time. Any thread; the window
// may be gone by the time the caller uses it, unless the caller knows better.
[[nodiscard]] BWindow* GetAppWindow(const BApplication* app, const char* title);

// Draws the text into rect in the view's font and colours. What does not fit is cut at rect's edges, never
// wrapped. To be called inside the view's Draw.
void DrawText(BView* view, const BRect* rect, const char* text, uint8 flags);

// Sets the three components and makes the colour opaque.
void SetColor(rgb_color* color, uint8 redPart, uint8 greenPart, uint8 bluePart);

// Draws a bevelled frame along rect's edges, raised when sunken is 0. To be called inside the view's Draw.
void ThreeDRectangle(BView* view, const BRect* rect, uint8 sunken);
