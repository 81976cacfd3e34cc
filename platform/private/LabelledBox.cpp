#include "platform/private/LabelledBox.h"

#include <algorithm>

#include <QLabel>

#include "platform/private/Mnemonics.h"

// Pressing the label's mnemonic goes to the field, and so does a focus given to the box.
LabelledBox::LabelledBox(QWidget* field) : label_(new QLabel(this)), field_(field) {
    field_->setParent(this);
    label_->setTextFormat(Qt::PlainText);
    label_->setAlignment(Qt::AlignLeft | Qt::AlignAbsolute | Qt::AlignVCenter);
    label_->setBuddy(field_);
    setFocusProxy(field_);
}

void LabelledBox::SetNames(const char* name) {
    const QString text = QString::fromUtf8(name);
    field_->setObjectName(text);
    setObjectName(text + QLatin1String(" container"));
}

void LabelledBox::SetLabel(const char* label) {
    ShowLabel(label_, label);
    field_->setAccessibleName(QString::fromUtf8(label));
    setAccessibleName(QString());
}

void LabelledBox::SetDivider(int divider) {
    divider_ = std::max(divider, 0);
    LayOut();
}

void LabelledBox::LayOut() {
    const int room = std::max(width() - divider_, 0);
    label_->setGeometry(0, 0, std::min(divider_, width()), height());
    field_->setGeometry(divider_, 0, limited_ ? std::min(room, field_->sizeHint().width()) : room, height());
}

QSize LabelledBox::sizeHint() const {
    const QSize field = field_->sizeHint();
    return {divider_ + field.width(), std::max(field.height(), label_->sizeHint().height())};
}

void LabelledBox::resizeEvent(QResizeEvent*) {
    LayOut();
}
