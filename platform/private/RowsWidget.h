#pragma once

// The widget of a list view. Only for the layer's own sources.

#include <memory>

#include <QInputEvent>
#include <QListView>

#include "platform/ListView.h"

struct ListPeer;

// The toolkit's list over our rows: it lays out, scrolls and selects; a row draws itself, when visible,
// through the delegate. Presses go through the view's MouseDown. Belongs to its view's peer.
class RowsWidget : public QListView {
    Q_DISABLE_COPY_MOVE(RowsWidget)

  public:
    explicit RowsWidget(BListView* owner);
    ~RowsWidget() override;

    void SetPeer(ListPeer* peer) { peer_ = peer; }
    // No hook of the view is called from now on.
    void Orphan() { peer_ = nullptr; }
    // The row that keys go on from; -1 for none.
    [[nodiscard]] int32 ChosenRow() const;

    // The bars that the list may show.
    void SetBars(bool horizontal, bool vertical);
    [[nodiscard]] BPoint Offset() const;
    void SetOffset(BPoint offset);
    // The part of the content that is seen.
    [[nodiscard]] QSize VisibleSize() const;
    void DataWidthChanged();
    // Row heights have changed.
    void LayOutSoon() { scheduleDelayedItemsLayout(); }

    // Handles the press that MouseDown is being called for as the toolkit does; false when there is none.
    bool ForwardPress();
    // Draws a row, in the content's coordinates.
    void DrawRow(QPainter& painter, int32 index, const QRect& place, bool focus) const;

    [[nodiscard]] QRect visualRect(const QModelIndex& index) const override;
    // All that is seen: the toolkit would go through every range of a scattered selection.
    [[nodiscard]] QRegion visualRegionForSelection(const QItemSelection& /*selection*/) const override {
        return viewport()->rect();
    }

  protected:
    void paintEvent(QPaintEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;
    void scrollContentsBy(int dx, int dy) override;
    void updateGeometries() override;
    void focusInEvent(QFocusEvent* event) override;
    void currentChanged(const QModelIndex& current, const QModelIndex& previous) override;
    void inputMethodEvent(QInputMethodEvent* event) override;
    QModelIndex moveCursor(CursorAction action, Qt::KeyboardModifiers modifiers) override;
    void keyPressEvent(QKeyEvent* event) override { Input(event); }
    void mousePressEvent(QMouseEvent* event) override { Input(event); }
    void mouseDoubleClickEvent(QMouseEvent* event) override { Input(event); }
    void mouseMoveEvent(QMouseEvent* event) override { Input(event); }
    void mouseReleaseEvent(QMouseEvent* event) override { Input(event); }

  private:
    void Input(QInputEvent* event);
    void HandlePress(QMouseEvent* event);
    void HandleKey(QKeyEvent* event);
    void HandleListKey(QKeyEvent* event);
    void SelectCurrentIfNone();
    void InvokeCurrent();
    void ShowBarIfNeeded();
    [[nodiscard]] int ContentWidth() const;
    [[nodiscard]] BPoint Where(const QMouseEvent& event) const;

    BListView* owner_;
    ListPeer* peer_ = nullptr;
    QMouseEvent* press_ = nullptr;     // while MouseDown runs
    QPersistentModelIndex pressedRow_; // by the last press that was forwarded
    QPersistentModelIndex focusMark_;  // the row that the toolkit made current as the focus came
    bool pressForwarded_ = false;
    bool mayScrollSideways_ = false;
    bool settingOffset_ = false;
};
