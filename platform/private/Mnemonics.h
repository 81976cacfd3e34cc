// Keyboard mnemonics (Alt and an underlined letter) for what a window shows. Only for the layer's own
// sources.
#pragma once

#include <QString>

class QAbstractButton;
class QAction;
class QLabel;
class QMenu;
class QWidget;

// The property of a widget or menu action that keeps its label as given; the text shown may carry a mnemonic
// mark. What lacks the property gets no mnemonic.
constexpr const char* kLabelProperty = "quorvanLabel";

// The label as toolkit text without any mnemonic: its own '&' doubled.
QString EscapeLabel(const QString& label);

// Makes the widget or action show the label and keeps it for the next assignment. In a window that is shown
// already the letters are given out anew. A QLabel needs a buddy to have a mnemonic.
void ShowLabel(QAbstractButton* button, const char* label);
void ShowLabel(QLabel* line, const char* label);
void ShowLabel(QAction* action, const char* label);

// Gives the window's menu titles, buttons, check boxes and labelled fields different letters, menu titles
// first, in their order; what finds no free letter has none.
void AssignMnemonics(QWidget* window);
// The same for the items of one menu.
void AssignMnemonics(QMenu* menu);
