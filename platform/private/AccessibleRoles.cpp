#include <vector>

#include <QAccessibleWidget>
#include <QPointer>

#include "platform/View.h"
#include "platform/private/ApplicationPeer.h"
#include "platform/private/Convert.h"
#include "platform/private/Loop.h"
#include "platform/private/ViewWidget.h"
#include "platform/private/WindowPeer.h"

namespace {

std::vector<AccessiblePart> PartsOf(const QWidget* widget) {
    const auto* view = static_cast<const ViewWidget*>(widget);
    return view ? view->Owner()->AccessibleParts() : std::vector<AccessiblePart>();
}

// One of the parts of a view: a column's header that can be pressed. It may outlive them.
class AccessibleViewPart : public QAccessibleInterface, public QAccessibleActionInterface {
  public:
    AccessibleViewPart(ViewWidget* view, int index) : view_(view), index_(index) {}

    [[nodiscard]] bool isValid() const override { return index_ < static_cast<int>(PartsOf(view_).size()); }
    [[nodiscard]] QObject* object() const override { return nullptr; }
    [[nodiscard]] QAccessibleInterface* parent() const override {
        return QAccessible::queryAccessibleInterface(view_);
    }
    [[nodiscard]] QAccessibleInterface* childAt(int, int) const override { return nullptr; }
    [[nodiscard]] QAccessibleInterface* child(int) const override { return nullptr; }
    [[nodiscard]] int childCount() const override { return 0; }
    int indexOfChild(const QAccessibleInterface*) const override { return -1; }
    [[nodiscard]] QAccessible::Role role() const override { return QAccessible::ColumnHeader; }

    [[nodiscard]] QString text(QAccessible::Text kind) const override {
        const AccessiblePart part = Part();
        return QString::fromStdString(kind == QAccessible::Name          ? part.name
                                      : kind == QAccessible::Description ? part.state
                                                                         : std::string());
    }
    void setText(QAccessible::Text, const QString&) override {}
    [[nodiscard]] QRect rect() const override {
        const QRect part = ToQt(Part().frame).toAlignedRect();
        return view_ ? QRect(view_->mapToGlobal(part.topLeft() - Origin()), part.size()) : QRect();
    }
    [[nodiscard]] QAccessible::State state() const override {
        QAccessible::State state;
        state.focusable = true;
        state.focused = view_ && view_->hasFocus() && Part().marked;
        return state;
    }

    void* interface_cast(QAccessible::InterfaceType type) override {
        return type == QAccessible::ActionInterface ? static_cast<QAccessibleActionInterface*>(this)
                                                    : nullptr;
    }
    [[nodiscard]] QStringList actionNames() const override { return {pressAction()}; }
    [[nodiscard]] QStringList keyBindingsForAction(const QString&) const override { return {}; }
    void doAction(const QString& action) override {
        if (!isValid() || action != pressAction())
            return;
        const InterfaceLock lock(view_->Owner()->Looper());
        view_->Owner()->PressPart(index_);
    }

  private:
    [[nodiscard]] AccessiblePart Part() const {
        std::vector<AccessiblePart> parts = PartsOf(view_);
        return index_ < static_cast<int>(parts.size()) ? parts[static_cast<std::size_t>(index_)]
                                                       : AccessiblePart();
    }
    [[nodiscard]] QPoint Origin() const {
        return {static_cast<int>(view_->Owner()->Bounds().left),
                static_cast<int>(view_->Owner()->Bounds().top)};
    }

    QPointer<ViewWidget> view_;
    int index_;
};

// Its description may come later, so the role is asked for each time.
class AccessibleView : public QAccessibleWidget {
    Q_DISABLE_COPY_MOVE(AccessibleView)

  public:
    explicit AccessibleView(ViewWidget* view) : QAccessibleWidget(view) {}
    ~AccessibleView() override {
        for (const QAccessible::Id part : parts_)
            QAccessible::deleteAccessibleInterface(part);
    }

    [[nodiscard]] QAccessible::Role role() const override {
        if (HasParts())
            return QAccessible::Grouping;
        return widget()->accessibleDescription().isEmpty() ? QAccessible::Client : QAccessible::Graphic;
    }
    [[nodiscard]] int childCount() const override {
        return HasParts() ? static_cast<int>(PartsOf(widget()).size()) : QAccessibleWidget::childCount();
    }
    [[nodiscard]] QAccessibleInterface* child(int index) const override {
        if (!HasParts())
            return QAccessibleWidget::child(index);
        if (index < 0 || index >= childCount())
            return nullptr;
        while (index >= static_cast<int>(parts_.size()))
            parts_.push_back(QAccessible::registerAccessibleInterface(
                new AccessibleViewPart(static_cast<ViewWidget*>(widget()), static_cast<int>(parts_.size()))));
        return QAccessible::accessibleInterface(parts_[static_cast<std::size_t>(index)]);
    }
    int indexOfChild(const QAccessibleInterface* wanted) const override {
        for (int index = 0; HasParts() && index < childCount(); ++index)
            if (child(index) == wanted)
                return index;
        return QAccessibleWidget::indexOfChild(wanted);
    }
    [[nodiscard]] QAccessibleInterface* childAt(int x, int y) const override {
        for (int index = 0; HasParts() && index < childCount(); ++index)
            if (child(index)->rect().contains(x, y))
                return child(index);
        return QAccessibleWidget::childAt(x, y);
    }
    [[nodiscard]] QAccessibleInterface* focusChild() const override {
        for (int index = 0; HasParts() && index < childCount(); ++index)
            if (child(index)->state().focused)
                return child(index);
        return QAccessibleWidget::focusChild();
    }

  private:
    [[nodiscard]] bool HasParts() const { return !PartsOf(widget()).empty(); }

    mutable std::vector<QAccessible::Id> parts_; // of those asked for so far
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
