// Views drawn elsewhere than on the screen. Only for the layer's own sources.
#pragma once

class BView;
struct BRect;
class QPainter;

// Draws that part of view, whose (0, 0) is the painter's origin, and of the views in it that are not hidden.
// Controls draw themselves.
void DrawTree(BView* view, QPainter& painter, const BRect& part);
