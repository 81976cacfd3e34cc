#include "platform/private/RowSelection.h"

#include <algorithm>

#include <QSignalBlocker>
#include <QTimer>

#include "platform/private/ListPeer.h"
#include "platform/private/RowModel.h"
#include "platform/private/RowsWidget.h"

namespace {

constexpr int kManyRanges = 100;

// The toolkit compares every range that was selected with every range that is going to be. Emptied first, a
// scattered selection costs no more than its ranges.
class RangeSelectionModel : public QItemSelectionModel {
    Q_DISABLE_COPY_MOVE(RangeSelectionModel)

  public:
    using QItemSelectionModel::QItemSelectionModel;
    using QItemSelectionModel::select;

    void select(const QItemSelection& ranges, SelectionFlags command) override {
        if (command.testFlag(Clear) && !ranges.isEmpty() && selection().size() > kManyRanges) {
            QItemSelectionModel::select(QItemSelection(), Clear);
            command.setFlag(Clear, false);
        }
        QItemSelectionModel::select(ranges, command);
    }
};

} // namespace

RowSelection::RowSelection(RowModel& model, RowsWidget& view, std::function<void()> changed)
    : model_(model), view_(view), changed_(std::move(changed)) {
    view.setModel(&model);
    delete view.selectionModel();
    auto* toolkit = new RangeSelectionModel(&model, &view);
    view.setSelectionModel(toolkit);
    QObject::connect(toolkit, &QItemSelectionModel::selectionChanged, toolkit,
                     [this](const QItemSelection& selected, const QItemSelection& deselected) {
                         TakeOver(selected, deselected);
                     });
}

void RowSelection::TakeOver(const QItemSelection& selected, const QItemSelection& deselected) {
    Mark(deselected, false);
    Mark(selected, true);
    orderKnown_ = false;
    changed_();
}

void RowSelection::Mark(const QItemSelection& ranges, bool selected) {
    for (const QItemSelectionRange& range : ranges)
        for (int32 index = range.top(); index <= range.bottom(); index++)
            if (BListItem* row = model_.At(index))
                ListAccess::SetSelected(*row, selected);
}

void RowSelection::Order() const {
    order_.clear();
    head_ = 0;
    shift_ = 0;
    for (int32 index = 0; index < model_.Count(); index++)
        if (model_.At(index)->IsSelected())
            order_.push_back(index);
    orderKnown_ = true;
}

int32 RowSelection::Nth(int32 n) const {
    if (!orderKnown_)
        Order();
    const std::size_t place = head_ + static_cast<std::size_t>(std::max(n, 0));
    return n < 0 || place >= order_.size() ? -1 : order_[place] - shift_;
}

int32 RowSelection::Current() const {
    if (attached_)
        return view_.ChosenRow();
    return current_ ? view_.IndexOf(current_) : -1;
}

// The program's choosing never scrolls.
void RowSelection::SetCurrent(int32 index) {
    Attach();
    view_.setAutoScroll(false);
    view_.selectionModel()->setCurrentIndex(model_.index(index), QItemSelectionModel::NoUpdate);
    view_.setAutoScroll(true);
}

void RowSelection::Select(int32 first, int32 last, bool extend) {
    Attach();
    if (!extend)
        SetCurrent(first);
    view_.selectionModel()->select(QItemSelection(model_.index(first), model_.index(last)),
                                   extend ? QItemSelectionModel::Select
                                          : QItemSelectionModel::ClearAndSelect);
}

void RowSelection::Deselect(int32 index) {
    Attach();
    view_.selectionModel()->select(model_.index(index), QItemSelectionModel::Deselect);
}

void RowSelection::Clear() {
    Attach();
    view_.selectionModel()->clearSelection();
}

void RowSelection::Detach() {
    if (!attached_)
        return;
    attached_ = false;
    current_ = model_.At(view_.currentIndex().row());
    view_.selectionModel()->reset();
    if (manyPlacesHeld_)
        model_.ForgetHeldPlaces();
    manyPlacesHeld_ = false;
    QTimer::singleShot(0, view_.selectionModel(), [this] { Attach(); });
}

void RowSelection::Attach() {
    if (attached_)
        return;
    attached_ = true;
    QItemSelection ranges;
    for (int32 index = 0; index < model_.Count(); index++) {
        if (!model_.At(index)->IsSelected())
            continue;
        int32 end = index;
        while (end + 1 < model_.Count() && model_.At(end + 1)->IsSelected())
            end++;
        ranges.append(QItemSelectionRange(model_.index(index), model_.index(end)));
        index = end;
    }
    manyPlacesHeld_ = ranges.size() > kManyRanges;
    QItemSelectionModel* toolkit = view_.selectionModel();
    const QSignalBlocker silent(toolkit);
    if (current_)
        toolkit->setCurrentIndex(model_.index(view_.IndexOf(current_)), QItemSelectionModel::NoUpdate);
    current_ = nullptr;
    toolkit->select(ranges, QItemSelectionModel::Select);
    view_.viewport()->update();
}

void RowSelection::RowsRemoved(int32 index, const std::vector<BListItem*>& rows) {
    const auto count = static_cast<int32>(rows.size());
    if (std::find(rows.begin(), rows.end(), current_) != rows.end())
        current_ = model_.At(std::min(index, model_.Count() - 1));
    // Taking the first selected row, again and again, or one above it, keeps the order known.
    if (orderKnown_ && Nth(0) >= 0 && Nth(0) < index)
        orderKnown_ = false;
    if (orderKnown_) {
        while (Nth(0) >= 0 && Nth(0) < index + count)
            head_++;
        shift_ += count;
    }
    bool anySelected = false;
    for (BListItem* row : rows) {
        anySelected = anySelected || row->IsSelected();
        ListAccess::SetSelected(*row, false);
    }
    if (anySelected)
        changed_();
}
