#pragma once

// What a list view has on the toolkit's side. Only for the layer's own sources.

#include "platform/private/RowModel.h"
#include "platform/private/RowSelection.h"
#include "platform/private/RowsWidget.h"
#include "platform/private/ViewPeer.h"

struct ListPeer : ViewPeer {
    explicit ListPeer(BListView* owner) : ViewPeer(new RowsWidget(owner)), selection(model, *Rows()) {}
    // The widget looks at the model to its end.
    ~ListPeer() override { delete widget; }

    [[nodiscard]] RowsWidget* Rows() const { return static_cast<RowsWidget*>(widget.data()); }
    [[nodiscard]] QWidget* Canvas() const override { return Rows()->viewport(); }

    // Has the toolkit ask one row only for its height as long as all are alike.
    void TakeHeights(const std::vector<BListItem*>& rows);
    void LayOutAgain();

    RowModel model;
    RowSelection selection;
    float dataWidth = 0;
    bool frameEvents = false;

  private:
    int rowHeight_ = 0; // of every row while the sizes are uniform
};

// The layer's own way into lists and rows.
struct ListAccess {
    static ListPeer& Peer(const BListView& list);
    static BListView* List(const BListItem& row) { return row.list_; }
    static void SetList(BListItem& row, BListView* list) { row.list_ = list; }
    static void SetSelected(BListItem& row, bool selected) { row.selected_ = selected; }
    // Whole pixels; at least one, so that every row has its place.
    static int Pixels(const BListItem& row);
};
