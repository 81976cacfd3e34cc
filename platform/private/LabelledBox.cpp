#include "platform/private/LabelledBox.h"

#include <algorithm>

#include <QLabel>

#include "platform/private/Mnemonics.h"

// A focus given to the box goes to the field.
LabelledBox::LabelledBox(QWidget* field) : field_(field) {
    field_->setParent(this);
    setFocusProxy(field_);
}

void LabelledBox::SetNames(const char* name) {
    const QString text = QString::fromUtf8(name);
    field_->setObjectName(text);
    setObjectName(text + QLatin1String(" container"));
}

// Pressing the label's mnemonic goes to the field. A label without a text would be taken for the field's
// name.
void LabelledBox::SetLabel(const char* label) {
    if (!label || *label == '\0') {
        delete label_;
        label_ = nullptr;
    } else {
        if (!label_) {
            label_ = new QLabel(this);
            label_->setTextFormat(Qt::PlainText);
            label_->setAlignment(Qt::AlignLeft | Qt::AlignAbsolute | Qt::AlignVCenter);
            label_->setBuddy(field_);
            label_->lower(); // who reads on comes to it first
            label_->show();
        }
        ShowLabel(label_, label);
    }
    LayOut();
    field_->setAccessibleName(QString::fromUtf8(label));
    setAccessibleName(QString());
}

void LabelledBox::SetDivider(int divider) {
    divider_ = std::max(divider, 0);
    LayOut();
}

void LabelledBox::LayOut() {
    const int room = std::max(width() - divider_, 0);
    if (label_)
        label_->setGeometry(0, 0, std::min(divider_, width()), height());
    field_->setGeometry(divider_, 0, limited_ ? std::min(room, field_->sizeHint().width()) : room, height());
}

QSize LabelledBox::sizeHint() const {
    const QSize field = field_->sizeHint();
    return {divider_ + field.width(), std::max(field.height(), label_ ? label_->sizeHint().height() : 0)};
}

void LabelledBox::resizeEvent(QResizeEvent*) {
    LayOut();
}
