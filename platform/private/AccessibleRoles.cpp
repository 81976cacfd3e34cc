#include "platform/private/AccessibleRoles.h"

#include <QAccessibleWidget>

#include "platform/private/ViewWidget.h"
#include "platform/private/WindowPeer.h"

namespace {

// Its description may come later, so the role is asked for each time.
class AccessibleView : public QAccessibleWidget {
  public:
    explicit AccessibleView(ViewWidget* view) : QAccessibleWidget(view) {}

    [[nodiscard]] QAccessible::Role role() const override {
        return widget()->accessibleDescription().isEmpty() ? QAccessible::Client : QAccessible::Graphic;
    }
};

QAccessibleInterface* MakeInterface(const QString&, QObject* object) {
    if (auto* window = dynamic_cast<WindowWidget*>(object))
        return new QAccessibleWidget(window, window->isModal() ? QAccessible::Dialog : QAccessible::Window);
    if (auto* view = dynamic_cast<ViewWidget*>(object))
        return new AccessibleView(view);
    return nullptr;
}

} // namespace

void NameAccessibleRoles() {
    QAccessible::installFactory(MakeInterface);
}
