// Keyboard mnemonics (Alt and an underlined letter) for what a window shows. Only for the layer's own
// sources.
#pragma once

#include <QString>

class QMenu;
class QWidget;

// The widget property that keeps a label as given; the widget's text may carry a mnemonic mark.
constexpr const char* kLabelProperty = "quorvanLabel";

// The label as toolkit text without any mnemonic: its own '&' doubled.
QString EscapeLabel(const char* label);

// Gives the window's menu titles, buttons, check boxes and labelled fields different letters, menu titles
// first, in their order; what finds no free letter has none.
void AssignMnemonics(QWidget* window);
// The same for the items of one menu.
void AssignMnemonics(QMenu* menu);
