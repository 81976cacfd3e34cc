#include "platform/FormView.h"

#include <algorithm>

#include <QApplication>
#include <QScrollArea>

#include "platform/private/ViewPeer.h"

namespace {

constexpr int Margin = 10; // below the last control

// What it holds is as wide as is seen, and as high as its controls are. Belongs to its view's peer.
class FormArea : public QScrollArea {
    Q_DISABLE_COPY_MOVE(FormArea)

  public:
    FormArea() {
        setFrameShape(NoFrame);
        setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
        setWidget(new QWidget);
        widget()->setAutoFillBackground(false);
        viewport()->setAutoFillBackground(false);
        connect(qApp, &QApplication::focusChanged, this, [this](QWidget*, QWidget* now) {
            if (now && widget()->isAncestorOf(now))
                ensureWidgetVisible(now);
        });
    }

  protected:
    void resizeEvent(QResizeEvent* event) override {
        const int controls = widget()->childrenRect().bottom() + 1 + Margin;
        widget()->resize(viewport()->width(), std::max(controls, viewport()->height()));
        QScrollArea::resizeEvent(event);
    }
};

struct FormPeer : ViewPeer {
    FormPeer() : ViewPeer(new FormArea) {}
    [[nodiscard]] QWidget* Canvas() const override { return static_cast<FormArea*>(widget.data())->widget(); }
};

} // namespace

BFormView::BFormView(BRect frame, const char* name, uint32 resizingMode)
    : BView(frame, name, resizingMode, B_WILL_DRAW, std::make_unique<FormPeer>()) {}
