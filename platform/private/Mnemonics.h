#pragma once

// Keyboard mnemonics (Alt and an underlined letter) for what a window shows. Only for the layer's own
// sources.

#include <QString>
#include <QVariant>

class QMenu;
class QWidget;

// The property of a widget or menu action that keeps its label as given; the text shown may carry a mnemonic
// mark. What lacks the property gets no mnemonic.
constexpr const char* LabelProperty = "quorvanLabel";

// The label as toolkit text without any mnemonic: its own '&' doubled.
QString EscapeLabel(const QString& label);

// Makes the widget or action show the label and keeps it for the next assignment. A QLabel needs a buddy to
// have a mnemonic.
template <class Shown>
void ShowLabel(Shown* shown, const char* label) {
    const QString text = QString::fromUtf8(label);
    shown->setProperty(LabelProperty, text);
    shown->setText(EscapeLabel(text));
}

// Gives the window's menu titles, buttons, check boxes and labelled fields different letters, menu titles
// first, in their order; what finds no free letter has none.
void AssignMnemonics(QWidget* window);
// The same for the items of one menu.
void AssignMnemonics(QMenu* menu);
