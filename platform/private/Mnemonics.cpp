#include "platform/private/Mnemonics.h"

#include <QAbstractButton>
#include <QAction>
#include <QLabel>
#include <QMenu>
#include <QMenuBar>
#include <QSet>

namespace {

using Letters = QSet<QChar>;

// Where the label's mnemonic letter stands: the first free beginning of a word, else the first free letter;
// -1 when every letter is taken. The letter is taken.
qsizetype TakeLetter(const QString& label, Letters& taken) {
    for (const bool wordsOnly : {true, false}) {
        for (qsizetype at = 0; at < label.size(); ++at) {
            const QChar letter = label[at].toLower();
            const bool begins = at == 0 || !label[at - 1].isLetterOrNumber();
            if (!letter.isLetterOrNumber() || (wordsOnly && !begins) || taken.contains(letter))
                continue;
            taken.insert(letter);
            return at;
        }
    }
    return -1;
}

QString WithMnemonic(const QString& label, Letters& taken) {
    const qsizetype at = TakeLetter(label, taken);
    if (at < 0)
        return EscapeLabel(label);
    return EscapeLabel(label.left(at)) + QLatin1Char('&') + label.mid(at, 1) + EscapeLabel(label.mid(at + 1));
}

template <class Shown>
void Assign(Shown* shown, Letters& taken) {
    const QVariant label = shown->property(LabelProperty);
    if (label.isValid())
        shown->setText(WithMnemonic(label.toString(), taken));
}

} // namespace

QString EscapeLabel(const QString& label) {
    return QString(label).replace(QLatin1Char('&'), QLatin1String("&&"));
}

void AssignMnemonics(QWidget* window) {
    Letters taken;
    for (const QMenuBar* bar : window->findChildren<QMenuBar*>())
        for (QAction* title : bar->actions())
            Assign(title, taken);
    for (QWidget* widget : window->findChildren<QWidget*>())
        if (auto* button = qobject_cast<QAbstractButton*>(widget))
            Assign(button, taken);
        else if (auto* line = qobject_cast<QLabel*>(widget); line && line->buddy())
            Assign(line, taken);
}

void AssignMnemonics(QMenu* menu) {
    Letters taken;
    for (QAction* item : menu->actions())
        Assign(item, taken);
}
