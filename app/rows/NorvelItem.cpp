#include "app/rows/NorvelItem.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>
#include <string_view>

#include "app/state/AppState.h"
#include "platform/View.h"
#include "util/interface/InterfaceHelpers.h"

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

// The texts of a record's fields, which may lack their ends in a foreign file.
struct NorvelItem::Fields {
    explicit Fields(const INVESTMENT_DATA& record)
        : texts{Cut(record.Name), Cut(record.Ticker), Cut(record.Type), Cut(record.Agent), Cut(record.Risk)} {
    }

    template <std::size_t Size>
    static std::string_view Cut(const char (&field)[Size]) {
        return {field, strnlen(field, Size - 1)};
    }
    [[nodiscard]] std::size_t Bytes() const {
        std::size_t bytes = FieldCount; // the terminators
        for (const std::string_view text : texts)
            bytes += text.size();
        return bytes;
    }

    std::string_view texts[FieldCount];
};

std::unique_ptr<NorvelItem> NorvelItem::Make(const INVESTMENT_DATA& record, int32 recordNumber) {
    const Fields fields(record);
    return std::unique_ptr<NorvelItem>(new (TextBytes{fields.Bytes()})
                                           NorvelItem(record, recordNumber, fields));
}

NorvelItem::NorvelItem(const INVESTMENT_DATA& record, int32 recordNumber, const Fields& fields)
    : CLVListItem(0, false, false, LeastHeight),
      recordNumber_(recordNumber),
      shares_(record.Shares),
      price_(record.Price),
      value_(record.Value),
      date_(record.Date),
      movement_(MoveOf(record)),
      retire_(record.Retire != 0) {
    char* const first = reinterpret_cast<char*>(this + 1);
    char* end = first;
    for (int field = 0; field < FieldCount; ++field) {
        const std::string_view text = fields.texts[field];
        begins_[field] = static_cast<uint8>(end - first);
        end = std::copy(text.begin(), text.end(), end);
        *end++ = '\0';
    }
}

const char* NorvelItem::Text(int32 column) const {
    switch (static_cast<InvestmentColumn>(column)) {
    case InvestmentColumn::Name:
        return FieldText(Name);
    case InvestmentColumn::Ticker:
        return FieldText(Ticker);
    case InvestmentColumn::Type:
        return FieldText(Type);
    case InvestmentColumn::Retire:
        return retire_ ? "yes" : "no";
    case InvestmentColumn::Risk:
        return FieldText(Risk);
    case InvestmentColumn::Agent:
        return FieldText(Agent);
    default:
        return FigureOf(static_cast<InvestmentColumn>(column));
    }
}

const char* NorvelItem::FigureOf(InvestmentColumn column) const {
    if (column < InvestmentColumn::Shares || column > InvestmentColumn::Date)
        return "";
    if (!figures_)
        figures_ = std::make_unique<Figures>();
    const auto place = static_cast<int32>(column) - static_cast<int32>(InvestmentColumn::Shares);
    std::unique_ptr<char[]>& figure = (*figures_)[static_cast<std::size_t>(place)];
    if (!figure) {
        FigureText text;
        Format(column, text);
        const std::size_t size = std::strlen(text) + 1;
        figure = std::make_unique<char[]>(size);
        std::copy_n(text, size, figure.get());
    }
    return figure.get();
}

void NorvelItem::Format(InvestmentColumn column, FigureText& out) const {
    switch (column) {
    case InvestmentColumn::Shares:
        return FormatShares(shares_, out);
    case InvestmentColumn::Price:
        return FormatPrice(price_, FieldText(Type), out);
    case InvestmentColumn::Value:
        return FormatValue(value_, out);
    default:
        return FormatDay(date_, out);
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

std::string NorvelItem::SearchText() const {
    return FieldText(Name);
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
