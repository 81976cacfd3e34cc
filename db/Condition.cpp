#include "db/Condition.h"

#include <array>
#include <cstring>
#include <string_view>

#include "db/FieldValue.h"
#include "util/Strings.h"

namespace {

constexpr int CaseBit = 'a' - 'A';

// Lowered bytes by table: one load instead of two comparisons for each byte of a million fields.
constexpr auto LoweredBytes = [] {
    std::array<unsigned char, 256> table{};
    for (std::size_t i = 0; i < table.size(); ++i)
        table[i] = LoweredByte(static_cast<std::uint8_t>(i));
    return table;
}();

int Order(unsigned char a, unsigned char b) {
    return static_cast<int>(a) - static_cast<int>(b);
}

// The order of a field (ended by a NUL or by its width) and a value. A field that agrees with the value over
// its whole width is no shorter than the value's text, so the value's byte at `width` exists.
int CompareExact(const std::uint8_t* field, std::size_t width, const char* value, std::size_t from = 0) {
    for (std::size_t i = from; i < width; ++i) {
        const auto v = static_cast<unsigned char>(value[i]);
        if (field[i] != v || v == 0)
            return Order(field[i], v);
    }
    return Order(0, static_cast<unsigned char>(value[width]));
}

// The same for a value in lower letters. As long as field and value agree, both reach their first byte of 128
// or above, from where on case counts, at the same place.
int CompareLowered(const std::uint8_t* field, std::size_t width, const char* value) {
    for (std::size_t i = 0; i < width; ++i) {
        if (field[i] >= FirstNonAscii)
            return CompareExact(field, width, value, i);
        const unsigned char f = LoweredBytes[field[i]];
        const auto v = static_cast<unsigned char>(value[i]);
        if (f != v || v == 0)
            return Order(f, v);
    }
    return Order(0, static_cast<unsigned char>(value[width]));
}

std::size_t AsciiLength(std::string_view text) {
    std::size_t length = 0;
    while (length < text.size() && static_cast<unsigned char>(text[length]) < FirstNonAscii)
        ++length;
    return length;
}

// Each operand is lowered up to its own first byte of 128 or above.
bool ContainsLowered(std::string_view field, std::string_view value) {
    const std::size_t fieldAscii = AsciiLength(field);
    const std::size_t valueAscii = AsciiLength(value);
    auto lowered = [](std::string_view text, std::size_t ascii, std::size_t i) {
        const auto c = static_cast<unsigned char>(text[i]);
        return i < ascii ? LoweredBytes[c] : c;
    };
    for (std::size_t at = 0; at + value.size() <= field.size(); ++at) {
        std::size_t i = 0;
        while (i < value.size() && lowered(field, fieldAscii, at + i) == lowered(value, valueAscii, i))
            ++i;
        if (i == value.size())
            return true;
    }
    return false;
}

constexpr std::size_t PlacesAtOnce = 16;

} // namespace

// The loops over records, one for each way to compare, so that nothing is decided again for each record.
struct Matchers {
    using Matcher = Condition::Matcher;

    template <class Field, int Op>
    static void Numbers(const Condition& self, const std::uint8_t* field, std::size_t stride,
                        std::size_t count, std::uint8_t* matches) {
        const auto value = static_cast<typename Field::Value>(self.number_);
        const std::size_t width = self.width_;
        for (std::size_t i = 0; i < count; ++i, field += stride)
            matches[i] = CompareValues(Op, Field::Load(field, width), value) != 0;
    }

    template <bool Exact, int Op>
    static void Texts(const Condition& self, const std::uint8_t* field, std::size_t stride, std::size_t count,
                      std::uint8_t* matches) {
        for (std::size_t i = 0; i < count; ++i, field += stride) {
            const int order = Exact ? CompareExact(field, self.width_, self.text_)
                                    : CompareLowered(field, self.width_, self.text_);
            matches[i] = CompareValues(Op, order, 0) != 0;
        }
    }

    // Two letters that differ in case only differ in one bit: a field equals the value when the bits that
    // count agree. A whole word is compared at once where the column has room for it.
    template <bool Equal, class Word>
    static void SameTexts(const Condition& self, const std::uint8_t* field, std::size_t stride,
                          std::size_t count, std::uint8_t* matches) {
        const std::size_t compared = std::min(self.length_ + 1, self.width_);
        const bool tooLong = self.length_ > self.width_;
        for (std::size_t i = 0; i < count; ++i, field += stride) {
            Word difference = tooLong ? 1 : 0;
            for (std::size_t at = 0; at < compared && difference == 0; at += sizeof(Word)) {
                difference =
                    static_cast<Word>((LoadBytes<Word>(field + at) ^ LoadBytes<Word>(self.text_ + at)) &
                                      LoadBytes<Word>(self.bits_ + at));
            }
            matches[i] = (difference == 0) == Equal;
        }
    }

    // Whether a place agrees with the value in the bits that count.
    static bool AgreesAt(const Condition& self, const std::uint8_t* place) {
        std::uint8_t difference = 0;
        for (std::size_t i = 0; i < self.length_; ++i)
            difference |= static_cast<std::uint8_t>((place[i] ^ self.text_[i]) & self.bits_[i]);
        return difference == 0;
    }

    // The first of some places in a row that agrees; their number when none does. The value's first and last
    // byte are looked at in all of them at once, which compilers turn into a few instructions.
    static std::size_t FirstOfBlock(const Condition& self, const std::uint8_t* places) {
        const std::size_t last = self.length_ - 1;
        const auto firstBits = static_cast<std::uint8_t>(self.bits_[0]);
        const auto lastBits = static_cast<std::uint8_t>(self.bits_[last]);
        const auto firstByte = static_cast<std::uint8_t>(self.text_[0] & firstBits);
        const auto lastByte = static_cast<std::uint8_t>(self.text_[last] & lastBits);
        std::uint8_t agree[PlacesAtOnce];
        for (std::size_t i = 0; i < PlacesAtOnce; ++i) {
            agree[i] = static_cast<std::uint8_t>(((places[i] & firstBits) == firstByte) &
                                                 ((places[i + last] & lastBits) == lastByte));
        }
        if ((LoadBytes<std::uint64_t>(agree) | LoadBytes<std::uint64_t>(agree + 8)) == 0)
            return PlacesAtOnce;
        std::size_t i = 0;
        while (i < PlacesAtOnce && !(agree[i] != 0 && AgreesAt(self, places + i)))
            ++i;
        return i;
    }

    // The first place in a column that agrees, whether the text reaches that far or not; the number of places
    // when none does.
    static std::size_t FirstPlace(const Condition& self, const std::uint8_t* field, std::size_t places) {
        std::size_t at = 0;
        if (places < PlacesAtOnce) {
            while (at < places && !AgreesAt(self, field + at))
                ++at;
            return at;
        }
        while (at < places) {
            at = std::min(at, places - PlacesAtOnce); // the last block begins in the one before
            const std::size_t found = FirstOfBlock(self, field + at);
            at += found;
            if (found < PlacesAtOnce)
                break;
        }
        return at;
    }

    template <bool Exact>
    static void ContainsText(const Condition& self, const std::uint8_t* field, std::size_t stride,
                             std::size_t count, std::uint8_t* matches) {
        const std::size_t places = self.length_ > self.width_ ? 0 : self.width_ - self.length_ + 1;
        for (std::size_t i = 0; i < count; ++i, field += stride) {
            const std::size_t place = FirstPlace(self, field, places);
            matches[i] = place < places && IsInText<Exact>(self, field, place + self.length_);
        }
    }

    // Whether what agrees and ends `end` bytes into the field is part of the text. Behind a byte of 128 or
    // above case counts, so that another place may be the right one.
    template <bool Exact>
    static bool IsInText(const Condition& self, const std::uint8_t* field, std::size_t end) {
        const std::string_view before = TextIn(field, end);
        if (!Exact && before.size() == end && AsciiLength(before) < end)
            return ContainsLowered(TextIn(field, self.width_), {self.text_, self.length_});
        return before.size() == end;
    }

    static void Nothing(const Condition& /*self*/, const std::uint8_t* /*field*/, std::size_t /*stride*/,
                        std::size_t count, std::uint8_t* matches) {
        std::memset(matches, 0, count);
    }

    // By operator; that a text is the same is found otherwise.
    template <class Field>
    static constexpr Matcher OfNumbers[] = {Numbers<Field, 0>, Numbers<Field, 1>, Numbers<Field, 2>,
                                            Numbers<Field, 3>, Numbers<Field, 4>, Numbers<Field, 5>};
    template <bool Exact>
    static constexpr Matcher OfTexts[] = {
        nullptr,         nullptr,         Texts<Exact, 2>,    Texts<Exact, 3>,
        Texts<Exact, 4>, Texts<Exact, 5>, ContainsText<Exact>};

    template <bool Equal>
    static Matcher OfSameTexts(std::size_t width) {
        return width % sizeof(std::uint64_t) == 0 ? SameTexts<Equal, std::uint64_t>
                                                  : SameTexts<Equal, std::uint8_t>;
    }
};

void Condition::Prepare(const COLUMN_ENTRY& column, int op, const char* value, bool exact) {
    offset_ = static_cast<std::size_t>(column.offset);
    width_ = static_cast<std::size_t>(column.size);
    matcher_ = Matchers::Nothing;
    if (column.type == ColumnType::String) {
        matcher_ = exact ? Matchers::OfTexts<true>[op] : Matchers::OfTexts<false>[op];
        if (op == CompareOperator::Equal)
            matcher_ = Matchers::OfSameTexts<true>(width_);
        else if (op == CompareOperator::Different)
            matcher_ = Matchers::OfSameTexts<false>(width_);
        PrepareText(value, exact);
    }
    VisitField(column.type, [&]<class Field>(Field) {
        number_ = static_cast<double>(Field::Parse(value));
        matcher_ = Matchers::OfNumbers<Field>[op];
    });
}

void Condition::PrepareText(const char* value, bool exact) {
    length_ = strnlen(value, TokenSize - 1);
    std::memcpy(text_, value, length_);
    std::memset(bits_, 0xFF, length_ + 1);
    if (!exact) {
        strlwr(text_);
        const std::size_t ascii = AsciiLength({text_, length_});
        for (std::size_t i = 0; i < ascii; ++i)
            bits_[i] = static_cast<char>(text_[i] >= 'a' && text_[i] <= 'z' ? ~CaseBit : ~0);
    }
}

int CompareOperatorOf(const char* token) {
    constexpr std::array<const char*, 7> spellings = {"=", "!=", "<", "<=", ">", ">=", "contains"};
    for (std::size_t op = 0; op < spellings.size(); ++op)
        if (strcmpi(token, spellings[op]) == 0)
            return static_cast<int>(op);
    return -1;
}

int CompareText(int op, const char* field, const char* value, bool exact) {
    if (op == CompareOperator::Contains) {
        const std::string_view text(field);
        return (exact ? text.find(value) != std::string_view::npos : ContainsLowered(text, value)) ? 1 : 0;
    }
    return CompareValues(op, exact ? std::strcmp(field, value) : strcmpi(field, value), 0);
}
