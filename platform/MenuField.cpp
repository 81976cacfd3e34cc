#include "platform/MenuField.h"

#include <cmath>

#include <QTimer>

#include "platform/private/FieldButton.h"
#include "platform/private/LabelledBox.h"
#include "platform/private/MenuPeer.h"
#include "platform/private/ViewPeer.h"

namespace {

LabelledBox* Box(const BMenuField* field) {
    return static_cast<LabelledBox*>(ViewAccess::Widget(field));
}

FieldButton* Button(const BMenuField* field) {
    return static_cast<FieldButton*>(Box(field)->Field());
}

} // namespace

BMenuField::BMenuField(BRect frame, const char* name, const char* label, BMenu* menu, uint32 resizingMode,
                       uint32 flags)
    : BView(frame, name, resizingMode, flags, std::make_unique<ViewPeer>(new LabelledBox(new FieldButton))),
      menu_(menu) {
    Box(this)->SetNames(Name());
    Box(this)->SetLabel(label);
    Box(this)->LimitFieldToHint();
    SetDivider(!label || *label == '\0' ? 0 : std::floor(frame.Width() / 2));
    Button(this)->SetMenu(MenuAccess::Peer(*menu_).menu.get());
    MenuPeer& peer = MenuAccess::Peer(*menu_);
    peer.shower = this;
    peer.itemsChanged = [this] { ShowMarked(); };
    QObject::connect(peer.menu.get(), &QMenu::aboutToShow, Box(this), [this] { PrepareMenu(); });
    ShowMarked();
    ResizeTo(frame.Width(), static_cast<float>(Button(this)->sizeHint().height() - 1));
}

BMenuField::~BMenuField() {
    Button(this)->SetMenu(nullptr);
}

// The keyboard starts at the marked item, or at the first one: Return has a choice to take at once.
void BMenuField::PrepareMenu() {
    QMenu* menu = MenuAccess::Peer(*menu_).menu.get();
    QTimer::singleShot(0, menu, [this, menu] {
        const BMenuItem* start = MenuItem();
        if (!start)
            start = menu_->ItemAt(0);
        if (start && menu->isVisible() && !menu->activeAction())
            menu->setActiveAction(MenuAccess::Peer(*start).action);
    });
}

void BMenuField::SetDivider(float divider) {
    Box(this)->SetDivider(static_cast<int>(std::lround(divider)));
}

// The layout is done first: a widget that is not shown hears of its new size only later.
float BMenuField::VisibleRight() const {
    Box(this)->LayOut();
    return Frame().left + static_cast<float>(Button(this)->geometry().right());
}

void BMenuField::SetTextChangedHook(std::function<void()> hook) {
    textChanged_ = std::move(hook);
}

void BMenuField::ShowMarked() {
    const BMenuItem* marked = MenuItem();
    const std::string shown = marked ? marked->Label() : menu_->Name();
    if (shown == shownText_)
        return;
    shownText_ = shown;
    Button(this)->SetFullText(QString::fromStdString(shown));
    Box(this)->LayOut();
    if (textChanged_)
        textChanged_();
}
