#pragma once

// Where windows come to stand. Only for the layer's own sources.

#include <QRect>

class QDialog;
class QWidget;

// The window that one which is about to open belongs to: the dialog that the person is in, or else the active
// window; none may be active for a moment when a dialog has closed, and then it is the newest that is shown.
// Null when none is.
QWidget* WindowBelow();

// Has the window manager keep the one window above the other, which may be null. It does not become its
// child: that window may go first.
void KeepAbove(QWidget& window, const QWidget* below);

// The part of the screen at this place, or else of the main one, that a window's content can fill: without
// the desktop's panels and the frame that the window manager draws.
QRect RoomAt(QPoint place);

// The place nearest to the wanted one that lies within the room; smaller only where the room is.
QRect PutInto(const QRect& room, const QRect& wanted);

// Has a dialog of the toolkit's, when it is shown, stand above the middle of the window, or in that of the
// main screen for null, wholly on the screen: what stands over its buttons scrolls where there is no room.
void PlaceDialog(QDialog& dialog, const QWidget* below);
