#include "app/rows/NorvelItem.h"

#include <cmath>
#include <cstring>

#include "ColumnListView/ColumnListView.h"
#include "app/state/AppState.h"
#include "platform/View.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr float LeastHeight = 20;
constexpr float Inset = 2; // of texts and picture from a column's left edge
constexpr rgb_color SelectedBackground{178, 178, 178, 255};

struct MoveLook {
    BBitmap* bitmap;
    const char* words;
};

MoveLook LookOf(PriceMove movement) {
    switch (movement) {
    case PriceMove::NotFound:
        return {ErrorSymbolBitmap, "no price found"};
    case PriceMove::Unknown:
        return {QuestionMarkBitmap, "no earlier price"};
    case PriceMove::Up:
        return {UpArrowBitmap, "price up"};
    case PriceMove::Down:
        return {DownArrowBitmap, "price down"};
    case PriceMove::Same:
        break;
    }
    return {EqualsSignBitmap, "price unchanged"};
}

// A field's text, which may lack its end in a foreign file.
template <std::size_t Size>
std::string Field(const char (&field)[Size]) {
    return {field, strnlen(field, Size - 1)};
}

template <class Format, class... Values>
std::string Figure(Format format, Values... values) {
    FigureText text;
    format(values..., text);
    return text;
}

std::array<std::string, InvestmentColumnCount> TextsOf(const INVESTMENT_DATA& record) {
    const std::string type = Field(record.Type);
    return {"",
            Field(record.Name),
            Field(record.Ticker),
            type,
            Figure(FormatShares, record.Shares),
            Figure(FormatPrice, record.Price, type.c_str()),
            Figure(FormatValue, record.Value),
            Figure(FormatDay, record.Date),
            record.Retire != 0 ? "yes" : "no",
            Field(record.Risk),
            Field(record.Agent)};
}

} // namespace

NorvelItem::NorvelItem(const INVESTMENT_DATA& record, int32 recordNumber)
    : CLVListItem(0, false, false, LeastHeight),
      recordNumber_(recordNumber),
      movement_(MoveOf(record)),
      texts_(TextsOf(record)) {}

const char* NorvelItem::Text(int32 column) const {
    return column > 0 && column < InvestmentColumnCount ? texts_[static_cast<std::size_t>(column)].c_str()
                                                        : "";
}

void NorvelItem::DrawItemColumn(BView* owner, BRect columnRect, int32 column, bool complete) {
    owner->SetLowColor(IsSelected() ? SelectedBackground : colors::white);
    owner->SetDrawingMode(B_OP_COPY);
    if (IsSelected() || complete)
        owner->FillRectLow(columnRect);
    const BRegion inside(columnRect);
    owner->ConstrainClippingRegion(&inside);
    owner->SetHighColor(colors::black);
    if (column == static_cast<int32>(InvestmentColumn::Status))
        DrawStatus(owner, columnRect);
    else if (column > 0)
        owner->DrawString(Text(column), {columnRect.left + Inset, columnRect.top + textOffset_});
    owner->ConstrainClippingRegion(nullptr);
}

void NorvelItem::DrawStatus(BView* owner, BRect columnRect) const {
    BRect target(0, 0, 15, 15);
    target.OffsetTo(columnRect.left + Inset, columnRect.top + Inset);
    if (Height() > LeastHeight)
        target.OffsetBy(0, std::ceil((Height() - LeastHeight) * 0.5F));
    owner->SetDrawingMode(B_OP_OVER);
    owner->DrawBitmap(LookOf(movement_).bitmap, BRect(0, 0, 15, 15), target);
    owner->SetDrawingMode(B_OP_COPY);
}

void NorvelItem::Update(BView* owner, const BFont* font) {
    CLVListItem::Update(owner, font);
    font_height height;
    be_plain_font->GetHeight(&height);
    const float ascent = std::ceil(height.ascent);
    textOffset_ = ascent + 0.5F * (Height() - (ascent + std::ceil(height.descent)));
}

std::string NorvelItem::AccessibleText() const {
    std::string all;
    for (int32 column = 1; column < InvestmentColumnCount; ++column) {
        const std::string text = Text(column);
        if (text.empty())
            continue;
        // The name needs no title to be understood.
        const CLVColumn* shown = List() && column > 1 ? List()->ColumnAt(column) : nullptr;
        all += (shown ? shown->GetLabel() + std::string(" ") : "") + text + ", ";
    }
    return all + LookOf(movement_).words;
}

std::string NorvelItem::SearchText() const {
    return Text(static_cast<int32>(InvestmentColumn::Name));
}

int NorvelItem::MyCompare(const CLVListItem* a, const CLVListItem* b, int32 column) {
    const std::unique_ptr<char[]> x(ToUpperStr(static_cast<const NorvelItem*>(a)->Text(column)));
    const std::unique_ptr<char[]> y(ToUpperStr(static_cast<const NorvelItem*>(b)->Text(column)));
    return std::strcmp(x.get(), y.get());
}
