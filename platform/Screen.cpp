#include "platform/Screen.h"

#include <QGuiApplication>
#include <QScreen>

#include "platform/private/Convert.h"

BRect BScreen::Frame() const {
    const QScreen* screen = QGuiApplication::primaryScreen();
    return screen ? FromQt(QRectF(screen->geometry())) : BRect();
}
