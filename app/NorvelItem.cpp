#include "app/NorvelItem.h"

#include <array>
#include <cmath>
#include <cstring>

#include "app/AppState.h"
#include "platform/View.h"
#include "util/InterfaceHelpers.h"

namespace {

constexpr float LeastHeight = 20;
constexpr float Inset = 2; // of texts and picture from a column's left edge
constexpr rgb_color SelectedBackground{178, 178, 178, 255};

constexpr std::array<unsigned char, 256> MakeUpperTable() {
    std::array<unsigned char, 256> table{};
    for (std::size_t i = 0; i < table.size(); ++i)
        table[i] = static_cast<unsigned char>(i >= 'a' && i <= 'z' ? i - 'a' + 'A' : i);
    return table;
}
constexpr std::array<unsigned char, 256> Upper = MakeUpperTable();

template <std::size_t Size>
void CopyField(char (&target)[Size], const char (&field)[Size]) {
    std::memcpy(target, field, Size);
    target[Size - 1] = '\0'; // a field of a foreign file may lack its end
}

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

} // namespace

NorvelItem::Shown::Shown(const INVESTMENT_DATA& record)
    : shares(record.Shares),
      price(record.Price),
      value(record.Value),
      date(record.Date),
      retire(record.Retire != 0) {
    CopyField(name, record.Name);
    CopyField(ticker, record.Ticker);
    CopyField(type, record.Type);
    CopyField(agent, record.Agent);
    CopyField(risk, record.Risk);
}

NorvelItem::NorvelItem(const INVESTMENT_DATA& record, int32 recordNumber)
    : CLVListItem(0, false, false, LeastHeight),
      recordNumber_(recordNumber),
      movement_(MoveOf(record)),
      shown_(record) {}

const char* NorvelItem::Text(int32 column) const {
    switch (static_cast<InvestmentColumn>(column)) {
    case InvestmentColumn::Name:
        return shown_.name;
    case InvestmentColumn::Ticker:
        return shown_.ticker;
    case InvestmentColumn::Type:
        return shown_.type;
    case InvestmentColumn::Retire:
        return shown_.retire ? "yes" : "no";
    case InvestmentColumn::Risk:
        return shown_.risk;
    case InvestmentColumn::Agent:
        return shown_.agent;
    default:
        return FigureOf(static_cast<InvestmentColumn>(column));
    }
}

const char* NorvelItem::FigureOf(InvestmentColumn column) const {
    if (!figures_)
        figures_ = std::make_unique<Figures>();
    switch (column) {
    case InvestmentColumn::Shares:
        if (figures_->shares[0] == '\0')
            FormatShares(shown_.shares, figures_->shares);
        return figures_->shares;
    case InvestmentColumn::Price:
        if (figures_->price[0] == '\0')
            FormatPrice(shown_.price, shown_.type, figures_->price);
        return figures_->price;
    case InvestmentColumn::Value:
        if (figures_->value[0] == '\0')
            FormatValue(shown_.value, figures_->value);
        return figures_->value;
    case InvestmentColumn::Date:
        if (figures_->date[0] == '\0')
            FormatDay(shown_.date, figures_->date);
        return figures_->date;
    default:
        return "";
    }
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
        const char* text = Text(column);
        if (*text == '\0')
            continue;
        all += text;
        all += ", ";
    }
    return all + LookOf(movement_).words;
}

int NorvelItem::MyCompare(const CLVListItem* a, const CLVListItem* b, int32 column) {
    const auto* x = reinterpret_cast<const unsigned char*>(static_cast<const NorvelItem*>(a)->Text(column));
    const auto* y = reinterpret_cast<const unsigned char*>(static_cast<const NorvelItem*>(b)->Text(column));
    while (*x != 0 && Upper[*x] == Upper[*y]) {
        ++x;
        ++y;
    }
    return Upper[*x] - Upper[*y];
}
