#pragma once

#include <string>

#include "platform/Types.h"

class BView;
struct BPoint;
struct BRect;

// What both charts draw alike. To be called inside the view's Draw.

// The title, in large letters; the view has the plain font then.
void DrawChartTitle(BView* view, const BRect& rect, const std::string& title);

// What stands in place of a chart of nothing; the view has the plain font then.
void DrawNothingToChart(BView* view);

// As DrawText, but in smaller letters where the end would be cut off: a number without its end is another
// number.
void DrawWholeText(BView* view, const BRect& rect, const std::string& text, uint8 flags);

// What the person points to: the text in a frame above the place, all of it inside the view.
void DrawNote(BView* view, BPoint place, const std::string& text);

// A frame when the view has the keyboard.
void DrawFocus(BView* view);
