#include "platform/private/RowSelection.h"

#include <algorithm>

#include <QSignalBlocker>
#include <QTimer>

#include "platform/private/ListPeer.h"
#include "platform/private/RowModel.h"
#include "platform/private/RowsWidget.h"

namespace {

constexpr int ManyRanges = 100;

// The toolkit compares every range that was selected with every range that is going to be. Emptied first, a
// scattered selection costs no more than its ranges.
class RangeSelectionModel : public QItemSelectionModel {
    Q_DISABLE_COPY_MOVE(RangeSelectionModel)

  public:
    using QItemSelectionModel::QItemSelectionModel;
    using QItemSelectionModel::select;

    void select(const QItemSelection& ranges, SelectionFlags command) override {
        if (command.testFlag(Clear) && !ranges.isEmpty() && selection().size() > ManyRanges) {
            QItemSelectionModel::select(QItemSelection(), Clear);
            command.setFlag(Clear, false);
        }
        QItemSelectionModel::select(ranges, command);
    }
};

} // namespace

RowSelection::RowSelection(RowModel& model, RowsWidget& view) : model_(model), view_(view) {
    view.setModel(&model);
    delete view.selectionModel();
    auto* toolkit = new RangeSelectionModel(&model, &view);
    view.setSelectionModel(toolkit);
    QObject::connect(toolkit, &QItemSelectionModel::selectionChanged, toolkit,
                     [this](const QItemSelection& selected, const QItemSelection& deselected) {
                         Mark(deselected, false);
                         Mark(selected, true);
                     });
}

void RowSelection::Mark(const QItemSelection& ranges, bool selected) {
    for (const QItemSelectionRange& range : ranges)
        for (int32 index = range.top(); index <= range.bottom(); ++index)
            if (BListItem* row = model_.At(index))
                ListAccess::SetSelected(*row, selected);
}

int32 RowSelection::Nth(int32 n) const {
    for (int32 index = 0; index < model_.Count() && n >= 0; ++index)
        if (model_.At(index)->IsSelected() && n-- == 0)
            return index;
    return -1;
}

int32 RowSelection::Current() const {
    if (attached_)
        return view_.ChosenRow();
    return current_ ? model_.IndexOf(current_) : -1;
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
    QTimer::singleShot(0, view_.selectionModel(), [this] { Attach(); });
}

void RowSelection::Attach() {
    if (attached_)
        return;
    attached_ = true;
    QItemSelection ranges;
    for (int32 index = 0; index < model_.Count(); ++index) {
        if (!model_.At(index)->IsSelected())
            continue;
        int32 end = index;
        while (end + 1 < model_.Count() && model_.At(end + 1)->IsSelected())
            ++end;
        ranges.append(QItemSelectionRange(model_.index(index), model_.index(end)));
        index = end;
    }
    QItemSelectionModel* toolkit = view_.selectionModel();
    const QSignalBlocker silent(toolkit);
    if (current_)
        toolkit->setCurrentIndex(model_.index(model_.IndexOf(current_)), QItemSelectionModel::NoUpdate);
    current_ = nullptr;
    toolkit->select(ranges, QItemSelectionModel::Select);
    view_.viewport()->update();
}

void RowSelection::RemoveSelected() {
    Detach();
    std::vector<BListItem*> kept;
    std::vector<BListItem*> removed;
    int32 place = 0; // of the current row among those kept
    for (BListItem* row : model_.Rows()) {
        if (row == current_)
            place = static_cast<int32>(kept.size());
        (row->IsSelected() ? removed : kept).push_back(row);
    }
    model_.Replace(std::move(kept));
    RowsRemoved(place, removed);
}

void RowSelection::RowsRemoved(int32 index, const std::vector<BListItem*>& rows) {
    if (std::find(rows.begin(), rows.end(), current_) != rows.end())
        current_ = model_.At(std::min(index, model_.Count() - 1));
    for (BListItem* row : rows) {
        ListAccess::SetList(*row, nullptr);
        ListAccess::SetSelected(*row, false);
    }
}
