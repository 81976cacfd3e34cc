#include "platform/TextControl.h"

#include <algorithm>
#include <cmath>
#include <limits>

#include <QLineEdit>
#include <QTextBoundaryFinder>
#include <QValidator>

#include "platform/private/LabelledBox.h"
#include "platform/private/ViewPeer.h"

namespace {

QString WithoutControls(QString text) {
    for (QChar& letter : text)
        if (letter.category() == QChar::Other_Control || letter == QChar::LineSeparator ||
            letter == QChar::ParagraphSeparator)
            letter = QLatin1Char(' ');
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

// The part of a changed text that was put in: what lies between the beginning and the end that it shares with
// the text before. The end starts at the cursor, which stands behind what was put in.
struct Change {
    qsizetype start;
    qsizetype length;

    Change(const QString& before, const QString& after, qsizetype cursor) {
        const auto common = std::min(before.size(), after.size());
        qsizetype tail = 0;
        while (tail < std::min(common, after.size() - cursor) &&
               before[before.size() - 1 - tail] == after[after.size() - 1 - tail])
            tail++;
        start = 0;
        while (start < common - tail && before[start] == after[start])
            start++;
        length = after.size() - tail - start;
    }
};

} // namespace

// Keeps a line's text within its bounds whatever way it is changed: the toolkit asks a validator about every
// change before it is taken, and a refusal leaves the text and its undo history alone.
class TextControlFilter : public QValidator {
    Q_DISABLE_COPY_MOVE(TextControlFilter)

  public:
    explicit TextControlFilter(QLineEdit* line) : QValidator(line) {
        line->setValidator(this);
        QObject::connect(line, &QLineEdit::textChanged, this,
                         [this](const QString& text) { before_ = text; });
    }

    void SetMaxBytes(qsizetype bytes) { maxBytes_ = bytes; }
    [[nodiscard]] QString Fit(const QString& text) const {
        return CutToBytes(WithoutControls(text), maxBytes_);
    }

    State validate(QString& text, int& cursor) const override {
        const Change change(before_, text, cursor);
        const QString put = text.mid(change.start, change.length);
        const QString kept = text.left(change.start) + text.mid(change.start + change.length);
        const QString taken = CutToBytes(WithoutControls(put), maxBytes_ - kept.toUtf8().size());
        if (taken == put)
            return Acceptable;
        QString result = kept;
        result.insert(change.start, taken);
        if (result == before_)
            return Invalid;
        text = result;
        cursor = std::min(cursor, static_cast<int>(change.start + taken.size()));
        return Acceptable;
    }

  private:
    QString before_;
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
                           BMessage* message, uint32 resizingMode, uint32 flags)
    : BControl(frame, name, label, message, resizingMode, flags,
               std::make_unique<ViewPeer>(new LabelledBox(new QLineEdit))),
      filter_(new TextControlFilter(Line(this))) {
    Box(this)->SetNames(Name());
    BTextControl::SetLabel(label);
    float width = 0;
    float height = 0;
    GetPreferredSize(&width, &height);
    ResizeTo(frame.Width(), height);
    SetDivider(std::floor(frame.Width() / 2));
    SetText(text);
    QObject::connect(Line(this), &QLineEdit::returnPressed, Line(this), [this] { Send(); });
    QObject::connect(Line(this), &QLineEdit::editingFinished, Line(this), [this] {
        if (sent_ != Text())
            Send();
    });
}

// A line that loses the focus as it goes must not call back. Others who want to hear of its end still do.
BTextControl::~BTextControl() {
    QObject::disconnect(Line(this), &QLineEdit::returnPressed, Line(this), nullptr);
    QObject::disconnect(Line(this), &QLineEdit::editingFinished, Line(this), nullptr);
}

void BTextControl::Send() {
    sent_ = Text();
    Invoke();
}

void BTextControl::SetLabel(const char* label) {
    BControl::SetLabel(label);
    Box(this)->SetLabel(Label());
}

void BTextControl::SetText(const char* text) {
    Line(this)->setText(filter_->Fit(QString::fromUtf8(text)));
    Line(this)->setCursorPosition(0);
    sent_ = Text();
}

const char* BTextControl::Text() const {
    text_ = Line(this)->text().toStdString();
    return text_.c_str();
}

void BTextControl::SetDivider(float divider) {
    Box(this)->SetDivider(static_cast<int>(std::lround(divider)));
}

float BTextControl::Divider() const {
    return static_cast<float>(Box(this)->Divider());
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
