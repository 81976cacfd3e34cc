#include "platform/private/RowsWidget.h"

#include <algorithm>
#include <cmath>

#include <QAbstractItemDelegate>
#include <QMouseEvent>
#include <QPainter>
#include <QScrollBar>

#include "platform/private/Convert.h"
#include "platform/private/ListPeer.h"
#include "platform/private/Loop.h"
#include "platform/private/ViewWidget.h"

namespace {

class RowDelegate : public QAbstractItemDelegate {
    Q_DISABLE_COPY_MOVE(RowDelegate)

  public:
    explicit RowDelegate(RowsWidget* view) : QAbstractItemDelegate(view), view_(view) {}

    void paint(QPainter* painter, const QStyleOptionViewItem& option,
               const QModelIndex& index) const override {
        view_->DrawRow(*painter, index.row(), option.rect, option.state.testFlag(QStyle::State_HasFocus));
    }
    // How wide the rows are the list says itself.
    QSize sizeHint(const QStyleOptionViewItem&, const QModelIndex& index) const override {
        const auto* model = static_cast<const RowModel*>(index.model());
        const BListItem* row = model->At(index.row());
        return {1, row ? ListAccess::Pixels(*row) : 1};
    }

  private:
    RowsWidget* view_;
};

// Dark dots on a light line: seen on every row, and only at its edge.
void DrawFocus(QPainter& painter, const BRect& row) {
    const QRectF edge = ToQt(row).adjusted(0.5, 0.5, -0.5, -0.5);
    painter.setRenderHint(QPainter::Antialiasing, false);
    painter.setBrush(Qt::NoBrush);
    painter.setPen(QPen(Qt::white, 1));
    painter.drawRect(edge);
    painter.setPen(QPen(Qt::black, 1, Qt::DotLine));
    painter.drawRect(edge);
}

} // namespace

// Columns and scrolling keep their direction whatever the language of the desktop.
RowsWidget::RowsWidget(BListView* owner) : owner_(owner) {
    setItemDelegate(new RowDelegate(this));
    setLayoutDirection(Qt::LeftToRight);
    setVerticalScrollMode(ScrollPerPixel);
    setHorizontalScrollMode(ScrollPerPixel);
    setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
    setVerticalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
    setEditTriggers(NoEditTriggers);
    setUniformItemSizes(true);
    setFrameShape(NoFrame);
    viewport()->setAttribute(Qt::WA_OpaquePaintEvent);
}

RowsWidget::~RowsWidget() = default;

void RowsWidget::SetBars(bool horizontal, bool vertical) {
    mayScrollSideways_ = horizontal;
    setVerticalScrollBarPolicy(vertical ? Qt::ScrollBarAsNeeded : Qt::ScrollBarAlwaysOff);
    ShowBarIfNeeded();
}

BPoint RowsWidget::Offset() const {
    return {static_cast<float>(horizontalOffset()), static_cast<float>(verticalOffset())};
}

void RowsWidget::SetOffset(BPoint offset) {
    executeDelayedItemsLayout(); // so that the bars know how far rows that just came reach
    settingOffset_ = true;
    horizontalScrollBar()->setValue(static_cast<int>(std::lround(offset.x)));
    verticalScrollBar()->setValue(static_cast<int>(std::lround(offset.y)));
    settingOffset_ = false;
}

// A widget that is not shown yet hears of its size only later.
QSize RowsWidget::VisibleSize() const {
    return testAttribute(Qt::WA_PendingResizeEvent) ? maximumViewportSize() : viewport()->size();
}

int RowsWidget::ContentWidth() const {
    const int rows = peer_ ? static_cast<int>(std::ceil(peer_->dataWidth)) : 0;
    return std::max(rows, viewport()->width());
}

void RowsWidget::DataWidthChanged() {
    ShowBarIfNeeded();
    updateGeometries();
    viewport()->update();
}

void RowsWidget::ShowBarIfNeeded() {
    const bool wanted = mayScrollSideways_ && ContentWidth() > viewport()->width();
    setHorizontalScrollBarPolicy(wanted ? Qt::ScrollBarAlwaysOn : Qt::ScrollBarAlwaysOff);
}

// The toolkit works out the sideways range from the widths of rows, which it would have to lay out again for
// every change; ours is known. The range that it sets on the way must not be noticed.
void RowsWidget::updateGeometries() {
    QScrollBar* bar = horizontalScrollBar();
    const int maximum = bar->maximum();
    const int value = bar->value();
    {
        const QSignalBlocker silent(bar);
        QListView::updateGeometries();
        bar->setRange(0, maximum);
        bar->setValue(value);
    }
    ShowBarIfNeeded();
    bar->setSingleStep(3 * fontMetrics().averageCharWidth());
    bar->setPageStep(viewport()->width());
    bar->setRange(0, mayScrollSideways_ ? ContentWidth() - viewport()->width() : 0);
}

void RowsWidget::resizeEvent(QResizeEvent* event) {
    QListView::resizeEvent(event);
    ShowBarIfNeeded();
    viewport()->update();
    if (!peer_ || !peer_->frameEvents)
        return;
    const InterfaceLock lock(owner_->Looper());
    owner_->FrameResized(static_cast<float>(viewport()->width() - 1),
                         static_cast<float>(viewport()->height() - 1));
}

void RowsWidget::scrollContentsBy(int dx, int dy) {
    QListView::scrollContentsBy(dx, dy);
    if (!peer_ || settingOffset_)
        return;
    const InterfaceLock lock(owner_->Looper());
    owner_->ScrollTo(Offset());
}

QRect RowsWidget::visualRect(const QModelIndex& index) const {
    QRect place = QListView::visualRect(index);
    if (place.isValid())
        place.setWidth(ContentWidth());
    return place;
}

void RowsWidget::paintEvent(QPaintEvent* event) {
    if (!peer_)
        return;
    peer_->selection.Attach();
    QPainter(viewport()).fillRect(event->rect(), ToQt(owner_->ViewColor()));
    const InterfaceLock lock(owner_->Looper());
    QListView::paintEvent(event);
}

void RowsWidget::DrawRow(QPainter& painter, int32 index, const QRect& place, bool focus) const {
    BListItem* row = peer_ ? peer_->model.At(index) : nullptr;
    if (!row)
        return;
    const BPoint offset = Offset();
    // The toolkit cuts the place to what it takes for the rows' width.
    const auto top = static_cast<float>(place.top()) + offset.y;
    const BRect frame(0, top, static_cast<float>(ContentWidth() - 1),
                      top + static_cast<float>(place.height() - 1));
    painter.save();
    painter.translate(-offset.x, -offset.y);
    {
        const PaintPass pass(owner_, &painter);
        row->DrawItem(owner_, frame, true);
    }
    if (focus)
        DrawFocus(painter, frame);
    painter.restore();
}

void RowsWidget::focusInEvent(QFocusEvent* event) {
    if (peer_)
        peer_->selection.Attach();
    const bool chosen = currentIndex().isValid();
    QListView::focusInEvent(event);
    if (!chosen)
        focusMark_ = currentIndex();
}

// The toolkit would let only rows that can be edited have letters that are composed: a search wants them too.
void RowsWidget::currentChanged(const QModelIndex& current, const QModelIndex& previous) {
    QListView::currentChanged(current, previous);
    setAttribute(Qt::WA_InputMethodEnabled);
}

void RowsWidget::inputMethodEvent(QInputMethodEvent* event) {
    if (!peer_)
        return;
    const InterfaceLock lock(owner_->Looper());
    peer_->selection.Attach();
    QListView::inputMethodEvent(event);
}

// Without a row to go on from, the toolkit would take End to the first one, too.
QModelIndex RowsWidget::moveCursor(CursorAction action, Qt::KeyboardModifiers modifiers) {
    if (action == MoveEnd && !currentIndex().isValid())
        return model()->index(model()->rowCount() - 1, 0);
    return QListView::moveCursor(action, modifiers);
}

void RowsWidget::Input(QInputEvent* event) {
    if (!peer_)
        return;
    const InterfaceLock lock(owner_->Looper());
    peer_->selection.Attach();
    if (event->type() == QEvent::KeyPress) {
        HandleKey(static_cast<QKeyEvent*>(event));
        return;
    }
    auto* mouse = static_cast<QMouseEvent*>(event);
    ViewAccess::NotePointer(owner_, Where(*mouse), ButtonBits(mouse->buttons()));
    if (event->type() == QEvent::MouseMove) {
        if (pressForwarded_ || mouse->buttons() == Qt::NoButton)
            QListView::mouseMoveEvent(mouse);
    } else if (event->type() == QEvent::MouseButtonRelease) {
        if (pressForwarded_)
            QListView::mouseReleaseEvent(mouse);
        owner_->MouseUp(Where(*mouse));
    } else {
        HandlePress(mouse);
    }
}

BPoint RowsWidget::Where(const QMouseEvent& event) const {
    return FromQt(event.position()) + Offset();
}

void RowsWidget::HandlePress(QMouseEvent* event) {
    BMessage message(MouseDownCode);
    message.AddPoint("where", Where(*event));
    message.AddInt32("buttons", static_cast<int32>(ButtonBits(event->buttons())));
    message.AddInt32("modifiers", static_cast<int32>(ModifierBits(event->modifiers())));
    const CurrentMessageScope scope(owner_->Looper(), &message);
    pressForwarded_ = false;
    press_ = event;
    owner_->MouseDown(Where(*event));
    press_ = nullptr;
}

// The second press of a double click on one row invokes and does nothing else: it must not turn over what a
// press with the command key has just selected.
bool RowsWidget::ForwardPress() {
    if (!press_)
        return false;
    QMouseEvent* event = std::exchange(press_, nullptr);
    const QModelIndex row = indexAt(event->position().toPoint());
    if (event->type() == QEvent::MouseButtonDblClick && event->button() == Qt::LeftButton && row.isValid() &&
        pressedRow_ == row) {
        InvokeCurrent();
        return true;
    }
    pressForwarded_ = true;
    pressedRow_ = row;
    QListView::mousePressEvent(event);
    return true;
}

void RowsWidget::HandleKey(QKeyEvent* event) {
    const bool plain = !(event->modifiers() & ~Qt::KeypadModifier);
    const int key = event->key();
    if (plain && (key == Qt::Key_Left || key == Qt::Key_Right)) {
        horizontalScrollBar()->triggerAction(key == Qt::Key_Left ? QScrollBar::SliderSingleStepSub
                                                                 : QScrollBar::SliderSingleStepAdd);
    } else if (plain && (key == Qt::Key_Return || key == Qt::Key_Enter)) {
        event->setAccepted(owner_->Message() != nullptr);
        if (event->isAccepted())
            InvokeCurrent();
    } else {
        HandleListKey(event);
    }
}

// A row that is only marked because the focus came was chosen by nobody.
int32 RowsWidget::ChosenRow() const {
    return currentIndex() == focusMark_ && !selectionModel()->hasSelection() ? -1 : currentIndex().row();
}

// A row that keys cannot leave, such as the first by Home, is selected where it is.
void RowsWidget::HandleListKey(QKeyEvent* event) {
    constexpr int moving[] = {Qt::Key_Up,  Qt::Key_Down,   Qt::Key_Home,
                              Qt::Key_End, Qt::Key_PageUp, Qt::Key_PageDown};
    const bool moves = std::find(std::begin(moving), std::end(moving), event->key()) != std::end(moving);
    if (moves && ChosenRow() < 0)
        selectionModel()->clearCurrentIndex();
    QListView::keyPressEvent(event);
    if (!moves)
        return;
    if (!(event->modifiers() & Qt::ControlModifier))
        SelectCurrentIfNone();
    // The toolkit does so only when another row became the current one.
    owner_->ScrollToRow(currentIndex().row());
}

// What is invoked is what is selected; a row that only has the keyboard's mark is selected first.
void RowsWidget::InvokeCurrent() {
    SelectCurrentIfNone();
    if (selectionModel()->hasSelection())
        owner_->Invoke();
}

void RowsWidget::SelectCurrentIfNone() {
    if (!selectionModel()->hasSelection() && currentIndex().isValid())
        peer_->selection.Select(currentIndex().row(), currentIndex().row(), false);
}
