#include "Pictures.h"

#include <QApplication>
#include <QPixmap>
#include <QScreen>
#include <QWidget>

namespace {

bool IsPlain(const QImage& image) {
    for (int y = 0; y < image.height(); ++y) {
        for (int x = 0; x < image.width(); ++x)
            if (image.pixel(x, y) != image.pixel(0, 0))
                return false;
    }
    return true;
}

} // namespace

bool Pictures::Take(const std::string& name) const {
    QRect covered;
    for (QWidget* window : QApplication::topLevelWidgets()) {
        if (!window->isVisible())
            continue;
        window->repaint();
        covered |= window->frameGeometry();
    }
    const QPixmap picture = QApplication::primaryScreen()->grabWindow(0, covered.x(), covered.y(),
                                                                      covered.width(), covered.height());
    return !picture.isNull() && !IsPlain(picture.toImage()) &&
           picture.save(QString::fromStdString(folder_ + "/" + name + ".png"));
}
