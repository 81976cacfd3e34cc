#include "platform/TextControl.h"

#include <algorithm>
#include <cmath>
#include <limits>

#include <QApplication>
#include <QLineEdit>
#include <QTextBoundaryFinder>
#include <QToolTip>
#include <QValidator>

#include "platform/private/LabelledBox.h"
#include "platform/private/ViewPeer.h"

namespace {

// What comes from a table or an editor often ends in a line end, which nobody means.
QString WithoutControls(QString text) {
    const auto isControl = [](QChar letter) {
        return letter.category() == QChar::Other_Control || letter == QChar::LineSeparator ||
               letter == QChar::ParagraphSeparator;
    };
    while (!text.isEmpty() && isControl(text.back()))
        text.chop(1);
    std::replace_if(text.begin(), text.end(), isControl, QLatin1Char(' '));
    return text;
}

// The longest beginning of text that ends between two characters as a person sees them and takes no more
// bytes of UTF-8 than room.
QString CutToBytes(const QString& text, qsizetype room) {
    if (text.toUtf8().size() <= room)
        return text;
    QTextBoundaryFinder characters(QTextBoundaryFinder::Grapheme, text);
    qsizetype fits = 0;
    qsizetype used = 0;
    for (qsizetype end = characters.toNextBoundary(); end >= 0; end = characters.toNextBoundary()) {
        used += text.mid(fits, end - fits).toUtf8().size();
        if (used > room)
            break;
        fits = end;
    }
    return text.left(fits);
}

} // namespace

// Keeps a line's text within its bounds whatever way it is changed: the toolkit asks a validator about every
// change before it is taken, and a refusal leaves the text and its undo history alone.
class TextControlFilter : public QValidator {
    Q_DISABLE_COPY_MOVE(TextControlFilter)

  public:
    explicit TextControlFilter(QLineEdit* line) : QValidator(line), line_(line) {
        line->setValidator(this);
        QObject::connect(
            line, &QLineEdit::inputRejected, this, [this] { TellTooLong(); });
        QObject::connect(line, &QLineEdit::textEdited, this, [] { QToolTip::hideText(); });
    }

    void SetMaxBytes(qsizetype bytes) {
        maxBytes_ = bytes;
        line_->setToolTip(QStringLiteral("At most %1 characters").arg(bytes));
    }
    [[nodiscard]] QString Fit(const QString& text) const {
        return CutToBytes(WithoutControls(text), maxBytes_);
    }

    State validate(QString& text, int& cursor) const override {
        const QString clean = WithoutControls(text);
        if (clean.toUtf8().size() > maxBytes_)
            return Invalid;
        text = clean;
        cursor = std::min(cursor, static_cast<int>(clean.size()));
        return Acceptable;
    }

  private:
    void TellTooLong() const {
        QApplication::beep();
        QToolTip::showText(line_->mapToGlobal(QPoint(0, line_->height())),
                           QStringLiteral("This is too long. At most %1 characters fit here; a letter with "
                                          "an accent counts as two.")
                               .arg(maxBytes_),
                           line_);
    }

    QLineEdit* line_;
    qsizetype maxBytes_ = std::numeric_limits<int32>::max();
};

namespace {

LabelledBox* Box(const BTextControl* control) {
    return static_cast<LabelledBox*>(ViewAccess::Widget(control));
}

QLineEdit* Line(const BTextControl* control) {
    return static_cast<QLineEdit*>(Box(control)->Field());
}

} // namespace

BTextControl::BTextControl(BRect frame, const char* name, const char* label, const char* text,
                           uint32 resizingMode, uint32 flags)
    : BControl(frame, name, label, nullptr, resizingMode, flags,
               std::make_unique<ViewPeer>(new LabelledBox(new QLineEdit))),
      filter_(new TextControlFilter(Line(this))) {
    Box(this)->SetNames(Name());
    Box(this)->SetLabel(label);
    ResizeTo(frame.Width(), static_cast<float>(Box(this)->sizeHint().height() - 1));
    SetDivider(std::floor(frame.Width() / 2));
    SetText(text);
}

void BTextControl::SetText(const char* text) {
    Line(this)->setText(filter_->Fit(QString::fromUtf8(text)));
    Line(this)->setCursorPosition(0);
}

const char* BTextControl::Text() const {
    text_ = Line(this)->text().toStdString();
    return text_.c_str();
}

void BTextControl::SetDivider(float divider) {
    Box(this)->SetDivider(static_cast<int>(std::lround(divider)));
}

void BTextControl::SetMaxBytes(int32 bytes) {
    filter_->SetMaxBytes(std::max(bytes, 0));
    const QString fitting = filter_->Fit(Line(this)->text());
    if (fitting != Line(this)->text())
        Line(this)->setText(fitting);
}

void BTextControl::MakeFocus(bool focus) {
    BView::MakeFocus(focus);
    if (focus)
        Line(this)->selectAll();
}

bool BTextControl::IsFocus() const {
    return Line(this)->hasFocus();
}
