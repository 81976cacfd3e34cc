#include "RecordModel.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <numeric>
#include <sstream>

namespace {

enum { Name, Tag, Small, Count, Price, Day, Clock };

// A to Z in small letters up to the first byte beyond ASCII.
std::string Lowered(std::string text) {
    for (char& c : text) {
        if (static_cast<unsigned char>(c) >= 128) {
            break;
        }
        c = c >= 'A' && c <= 'Z' ? static_cast<char>(c + 32) : c;
    }
    return text;
}

std::string NameOf(const ROW& row) {
    return {row.name, strnlen(row.name, sizeof(row.name))};
}

double NumberOf(const ROW& row, int column) {
    const auto byte = [](int part) { return static_cast<double>(part & 255); };
    switch (column) {
    case Tag:
        return row.tag;
    case Small:
        return row.small;
    case Count:
        return row.count;
    case Price:
        return row.price;
    case Day:
        return row.day.year * 65536.0 + byte(row.day.month) * 256 + byte(row.day.day);
    default:
        return byte(row.at.hour) * 65536 + byte(row.at.minute) * 256 + byte(row.at.second);
    }
}

template <class T>
bool Holds(const std::string& op, const T& a, const T& b) {
    return op == "="    ? a == b
           : op == "!=" ? a != b
           : op == "<"  ? a < b
           : op == "<=" ? a <= b
           : op == ">"  ? a > b
                        : a >= b;
}

void ChangeField(ROW* row, const MODEL_STATEMENT& set) {
    if (set.column == Name) {
        std::memset(row->name, 0, sizeof(row->name));
        set.value.copy(row->name, sizeof(row->name) - 1);
    } else {
        row->count = static_cast<std::int32_t>(static_cast<std::int64_t>(set.number) +
                                               (set.op == "+" ? row->count : 0));
    }
}

std::string Line(const ROW& row) {
    const std::string name = NameOf(row);
    const float price = row.price;
    char rest[200];
    std::snprintf(rest, sizeof(rest), "\t%d\t%d\t%d\t%.2f\t%04d%02d%02d\t%02d%02d%02d\t\n", row.tag,
                  row.small, row.count, static_cast<double>(price), row.day.year, row.day.month, row.day.day,
                  row.at.hour, row.at.minute, row.at.second);
    return (name.empty() ? " " : name) + rest;
}

// Reads groups of digits of these widths; after the first character that is none, all are 0.
std::vector<int> Groups(const std::string& text, const std::vector<std::size_t>& widths) {
    std::vector<int> groups;
    std::size_t at = 0;
    for (const std::size_t width : widths) {
        int group = 0;
        for (std::size_t i = 0; i < width && at < text.size() && text[at] >= '0' && text[at] <= '9';
             ++i, ++at) {
            group = group * 10 + (text[at] - '0');
        }
        groups.push_back(group);
    }
    return groups;
}

} // namespace

std::string MODEL_STATEMENT::Text() const {
    const auto columns = RowColumns();
    return columns[static_cast<std::size_t>(column)].name + (" " + op) + " " + value;
}

void RecordModel::WriteCounts() {
    written_ = headerWriting_ ? Counts() : written_;
}

void RecordModel::SetHeaderWriting(bool on) {
    headerWriting_ = on;
    WriteCounts();
}

std::pair<std::int32_t, std::int32_t> RecordModel::Counts() const {
    const auto deleted = std::count_if(records_.begin(), records_.end(),
                                       [](const RECORD& record) { return record.status == Deleted; });
    return {static_cast<std::int32_t>(Size()), static_cast<std::int32_t>(deleted)};
}

std::string RecordModel::Bytes() const {
    std::string bytes;
    for (const RECORD& record : records_) {
        bytes += static_cast<char>(record.status) + BytesOf(record.row);
    }
    return bytes;
}

OUTCOME RecordModel::Append(const std::vector<ROW>& rows) {
    const long first = Size();
    for (const ROW& row : rows) {
        records_.push_back({row, Active});
        current_ = Size() - 1;
    }
    WriteCounts();
    return {first, 0};
}

int RecordModel::Refusal(long n, int beyond, int deleted) const {
    return !Has(n) ? beyond : records_[static_cast<std::size_t>(n)].status == Deleted ? deleted : 0;
}

OUTCOME RecordModel::Read(long n, ROW* row) {
    if (const int code = Refusal(n, 1201, 1202)) {
        return {-1, code};
    }
    *row = At(n).row;
    current_ = n;
    return {1, 0};
}

OUTCOME RecordModel::Write(long n, const ROW& row) {
    if (const int code = Refusal(n, 1302, 1303)) {
        return {-1, code};
    }
    At(n) = {row, Active};
    current_ = n;
    return {};
}

OUTCOME RecordModel::Delete(long n) {
    if (const int code = Refusal(n, 1402, 1403)) {
        return {-1, code};
    }
    At(n).status = Deleted;
    current_ = -1;
    std::replace(slots_.begin(), slots_.end(), n, -1L);
    WriteCounts();
    return {};
}

OUTCOME RecordModel::Mark(long n, Status from, Status to, int beyond, int deleted, int other) {
    if (!Has(n) || At(n).status != from) {
        const int code = Refusal(n, beyond, deleted);
        return {-1, code != 0 ? code : other};
    }
    At(n).status = to;
    current_ = n;
    WriteCounts();
    return {};
}

OUTCOME RecordModel::IsLocked(long n) {
    const int code = Refusal(n, 2502, 2501);
    return code != 0 ? OUTCOME{-1, code} : OUTCOME{At(n).status == Locked ? 1 : 0, 0};
}

bool RecordModel::Matches(const ROW& row, const MODEL_STATEMENT& query) const {
    if (query.column != Name) {
        return Holds(query.op, NumberOf(row, query.column), query.number);
    }
    const std::string name = exact_ ? NameOf(row) : Lowered(NameOf(row));
    const std::string value = exact_ ? query.value : Lowered(query.value);
    return query.op == "contains" ? name.find(value) != name.npos : Holds(query.op, name, value);
}

long RecordModel::SetSize() const {
    return static_cast<long>(
        std::count_if(slots_.begin(), slots_.end(), [](long slot) { return slot >= 0; }));
}

OUTCOME RecordModel::Reset() {
    hasSet_ = true;
    slots_.clear();
    for (long n = 0; n < Size(); ++n) {
        slots_.push_back(At(n).status == Deleted ? -1 : n);
    }
    walk_ = 0;
    hasLast_ = false;
    return {SetSize(), 0};
}

OUTCOME RecordModel::Query(const MODEL_STATEMENT* query, int mode) {
    if (mode != QueryMode::New && (sorted_ || !hasSet_)) {
        return {-1, sorted_ ? 1601 : 1607};
    }
    if (query == nullptr) {
        return Reset();
    }
    if (query->op == "contains" && query->column != Name) {
        return {-1, 1606};
    }
    if (mode == QueryMode::New) {
        slots_.assign(records_.size(), -1);
        hasSet_ = true;
        sorted_ = false;
    }
    for (long n = 0; n < static_cast<long>(slots_.size()); ++n) {
        long& slot = slots_[static_cast<std::size_t>(n)];
        if ((slot >= 0) == (mode == QueryMode::And) && At(n).status != Deleted) {
            slot = Matches(At(n).row, *query) ? n : -1;
        }
    }
    walk_ = 0;
    hasLast_ = true;
    last_ = *query;
    return {SetSize(), 0};
}

OUTCOME RecordModel::QueryUpdate(const MODEL_STATEMENT& set) {
    if (set.op != "=" && set.op != "+") {
        return {-1, 2201};
    }
    if (set.column == Name && set.op != "=") {
        return {-1, 2203};
    }
    if (!hasLast_ || !hasSet_) {
        Reset();
    }
    long changed = 0;
    for (long n = 0; n < Size(); ++n) {
        if (std::find(slots_.begin(), slots_.end(), n) != slots_.end()) {
            ChangeField(&At(n).row, set);
            At(n).status = Active;
            current_ = n;
            ++changed;
        }
    }
    return {changed, 0};
}

OUTCOME RecordModel::Sort(int column) {
    if (!hasSet_) {
        Reset();
    }
    if (SetSize() < 2) {
        return {};
    }
    std::vector<long*> used;
    for (long& slot : slots_) {
        if (slot >= 0) {
            used.push_back(&slot);
        }
    }
    const auto greater = [&](long a, long b) {
        return column == Name ? Lowered(NameOf(At(a).row)) > Lowered(NameOf(At(b).row))
                              : NumberOf(At(a).row, column) > NumberOf(At(b).row, column);
    };
    for (bool swapped = true; swapped;) {
        swapped = false;
        for (std::size_t i = 0; i + 1 < used.size(); ++i) {
            if (greater(*used[i], *used[i + 1])) {
                std::swap(*used[i], *used[i + 1]);
                swapped = true;
            }
        }
    }
    sorted_ = true;
    return {};
}

long RecordModel::Walk(long start, long step) {
    if (!hasSet_) {
        Reset();
    }
    if (SetSize() == 0) {
        return -1;
    }
    walk_ = start >= 0 ? start : walk_ + step;
    for (; Has(walk_); walk_ += step) {
        const auto slot = static_cast<std::size_t>(walk_);
        if (slot < slots_.size() && slots_[slot] >= 0) {
            current_ = slots_[slot];
            return current_;
        }
    }
    return -1;
}

std::vector<long> RecordModel::Walked() {
    std::vector<long> numbers;
    for (long n = Walk(0, 1); n >= 0; n = Walk(-1, 1)) {
        numbers.push_back(n);
    }
    return numbers;
}

std::string RecordModel::Export(bool all, std::vector<ROW>* exported) {
    std::vector<long> numbers(records_.size());
    std::iota(numbers.begin(), numbers.end(), 0);
    exported->clear();
    std::string text;
    for (const long n : all ? numbers : Walked()) {
        if (At(n).status != Deleted) {
            exported->push_back(At(n).row);
            text += Line(At(n).row);
        }
    }
    return text;
}

ROW RecordModel::Reloaded(const ROW& row) {
    std::istringstream line(Line(row));
    std::string fields[7];
    for (std::string& field : fields) {
        std::getline(line, field, '\t');
    }
    const std::vector<int> date = Groups(fields[Day], {4, 2, 2});
    const std::vector<int> time = Groups(fields[Clock], {2, 2, 2});
    const auto byte = [](int part) { return static_cast<std::int8_t>(part); };
    return Row(fields[Name].substr(0, 15), fields[Tag][0], row.small, row.count,
               std::strtof(fields[Price].c_str(), nullptr),
               {byte(date[2]), byte(date[1]), static_cast<std::int16_t>(date[0])},
               {byte(time[2]), byte(time[1]), byte(time[0])});
}

void RecordModel::Compress() {
    std::erase_if(records_, [](const RECORD& record) { return record.status == Deleted; });
    for (RECORD& record : records_) {
        record.status = Active;
    }
    written_ = Counts();
    Reopen();
}

void RecordModel::Reopen() {
    hasSet_ = false;
    slots_.clear();
    sorted_ = false;
    hasLast_ = false;
    walk_ = 0;
    current_ = -1;
}

int RecordModel::IsQueryActive() const {
    const auto [count, deleted] = Counts();
    return hasSet_ && SetSize() < count - deleted ? 1 : 0;
}

long RecordModel::LogicalNumber(long n) const {
    const auto found = std::find(slots_.begin(), slots_.end(), n);
    return n < 0 || found == slots_.end()
               ? -1
               : static_cast<long>(std::count_if(slots_.begin(), found, [](long slot) { return slot >= 0; }));
}
