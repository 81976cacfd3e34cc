#pragma once

#include <string>

class BView;

enum class PictureFormat { Png, Svg, Pdf };

// Draws the view, with the views in it that are not hidden, in the view's own code and returns the picture
// file's bytes; empty when it cannot be made (a picture too large for the memory). A PNG has `scale` pixels
// for each of the view's; an SVG or PDF is sharp at any size and takes no notice of it (one pixel is one
// point of the PDF's page). The view may be hidden and need be in no window. Interface thread; an application
// object must exist.
[[nodiscard]] std::string DrawPicture(BView* view, PictureFormat format, float scale = 1);

// Puts a PNG picture on the clipboard, for other programs to paste. False when it is none. Interface thread.
[[nodiscard]] bool CopyPicture(const std::string& png);
