#include "tools/CsvImport.h"

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstring>

#include "app/model/PortfolioRules.h"
#include "db/DatesTimes.h"
#include "tools/CsvReader.h"
#include "tools/DataFileCopy.h"
#include "tools/InvestmentCells.h"
#include "tools/RecordFields.h"
#include "tools/Sentences.h"
#include "util/Strings.h"

namespace {

constexpr std::size_t PortfolioAt = offsetof(INVESTMENT_DATA, Portfolio);
constexpr std::size_t NameAt = offsetof(INVESTMENT_DATA, Name);
constexpr std::size_t TickerAt = offsetof(INVESTMENT_DATA, Ticker);
constexpr std::size_t RiskAt = offsetof(INVESTMENT_DATA, Risk);
constexpr std::size_t ValueAt = offsetof(INVESTMENT_DATA, Value);

std::string_view WithoutBlanks(std::string_view text) {
    const std::size_t begin = std::min(text.find_first_not_of(" \t"), text.size());
    return text.substr(begin, text.find_last_not_of(" \t") + 1 - begin);
}

std::string KeyOf(std::string_view portfolio, std::string_view ticker) {
    return Lowered(portfolio) + '\n' + Lowered(WithoutBlanks(ticker));
}

// The digits of a day such as 2024-03-05; any other text as none.
std::string DayDigits(std::string_view text) {
    constexpr std::size_t size = 10;
    constexpr std::size_t yearEnd = 4;
    constexpr std::size_t monthEnd = 7;
    if (text.size() != size || text[yearEnd] != '-' || text[monthEnd] != '-')
        return "none";
    return std::string(text.substr(0, yearEnd))
        .append(text.substr(yearEnd + 1, 2))
        .append(text.substr(monthEnd + 1));
}

// Replaces the column's value. Returns what is wrong with the text, or nothing.
std::string Replace(const COLUMN_ENTRY& column, std::string_view text, INVESTMENT_DATA* data) {
    auto* bytes = reinterpret_cast<std::uint8_t*>(data);
    std::memset(bytes + column.offset, 0, static_cast<std::size_t>(column.size));
    return StoreField(column, text, bytes);
}

std::string StoreText(const COLUMN_ENTRY& column, const std::string& text, INVESTMENT_DATA* data) {
    if (!IsColumn(column, RiskAt))
        return IsUtf8(text) ? Replace(column, text, data) : "is no UTF-8";
    const std::optional<std::size_t> risk = RiskIndex(WithoutBlanks(text));
    return risk ? Replace(column, RiskNames[*risk], data) : "is none of Low, Med and High";
}

std::string StoreFigure(const COLUMN_ENTRY& column, std::string_view text, char decimal,
                        INVESTMENT_DATA* data) {
    if (column.type == ColumnType::Float) {
        const PlainNumber number = ReadPlainNumber(text, decimal);
        return number.wrong.empty() ? Replace(column, number.text, data) : number.wrong;
    }
    if (column.type == ColumnType::Date) {
        const bool stored = Replace(column, DayDigits(text), data).empty();
        return stored && PackDate(data->Date) != 0 ? "" : "is no date of the form YYYY-MM-DD";
    }
    if (IsColumn(column, offsetof(INVESTMENT_DATA, Retire)))
        for (const char* word : {"no", "yes"})
            if (strcmpi(std::string(text).c_str(), word) == 0)
                return Replace(column, *word == 'y' ? "1" : "0", data);
    return Replace(column, text, data);
}

// Puts the change into the copy and makes that ready to take the file's place.
template <class Change>
std::string Prepare(DataFileCopy& copy, Change change) {
    std::string wrong = copy.Make();
    errno = 0;
    if (wrong.empty() && !change(copy.Data()))
        wrong = std::string("the copy that is to become the data file cannot be written: ") +
                (errno != 0 ? Reason(errno) : ErrorMessage(copy.Data().GetLastError(nullptr)));
    return wrong.empty() ? copy.Finish() : wrong;
}

} // namespace

CsvImport::CsvImport(ImportOptions options, DATABASE& portfolios, DATABASE& investments)
    : options_(std::move(options)), portfolios_(portfolios), investments_(investments) {}

void CsvImport::Tell(long line, const std::string& wrong) {
    wrong_.push_back("line " + std::to_string(line) + ": " + wrong);
}

std::string CsvImport::Read(std::string_view text, const std::function<void(long line)>& tell) {
    if (!ReadPresent())
        return "the portfolios and their investments could not all be read";
    if (!options_.portfolio.empty())
        if (std::string wrong = MakeKnown(options_.portfolio); !wrong.empty())
            return wrong;
    const std::string rest =
        ReadCsv(text, options_.delimiter, [&](long line, const std::vector<std::string>& fields) {
            tell(line);
            const auto isEmpty = [](const std::string& field) { return field.empty(); };
            if (targets_.empty())
                TakeHeading(line, fields);
            else if (understood_ && !std::all_of(fields.begin(), fields.end(), isEmpty))
                TakeRow(line, fields);
        });
    if (!rest.empty())
        wrong_.push_back(rest);
    else if (targets_.empty())
        Tell(1, "there is no heading that names the columns");
    return {};
}

bool CsvImport::ReadPresent() {
    std::vector<std::string> names;
    if (!CollectPortfolios(portfolios_, &names))
        return false;
    for (const std::string& name : names)
        known_.insert(Lowered(name));
    return ForEachInvestment(
        investments_, investments_.Query(nullptr, QueryMode::New),
        [&](const INVESTMENT_DATA& record, long number) {
            held_.insert(Lowered(FieldText(record.Portfolio)));
            if (options_.updateByTicker) {
                Holding& holding = tickers_[KeyOf(FieldText(record.Portfolio), FieldText(record.Ticker))];
                holding.record = number;
                ++holding.count;
            }
        });
}

std::string CsvImport::MakeKnown(const std::string& portfolio) {
    const std::string key = Lowered(portfolio);
    if (known_.contains(key))
        return {};
    if (!options_.create)
        return "there is no portfolio " + Quoted(portfolio) + "; --create makes it";
    if (!CanBePortfolioName(portfolio.c_str()) || !IsUtf8(portfolio) || IsBlank(portfolio))
        return Quoted(portfolio) + " can be no portfolio's name: that has 1 to 31 bytes of UTF-8, not only "
                                   "blanks, without tab and line end";
    if (held_.contains(key))
        return "there are investments of " + Quoted(portfolio) +
               ", which is not listed; `quorvan-cli check --repair` lists it";
    known_.insert(key);
    newPortfolios_.push_back(portfolio);
    return {};
}

void CsvImport::TakeHeading(long line, const std::vector<std::string>& fields) {
    for (const std::string& field : fields) {
        Target target = TargetOf(std::string(WithoutBlanks(field)));
        if (target.column && PlaceOf(static_cast<std::size_t>(target.column->offset)) < targets_.size())
            Tell(line, "the heading names " + target.label + " twice");
        else if (!target.column && !field.empty())
            unused_.push_back(field);
        targets_.push_back(std::move(target));
    }
    const auto has = [this](std::size_t offset) { return PlaceOf(offset) < targets_.size(); };
    if (has(ValueAt) && !(has(offsetof(INVESTMENT_DATA, Shares)) && has(offsetof(INVESTMENT_DATA, Price))))
        unused_.push_back(fields[PlaceOf(ValueAt)]);
    for (const COLUMN_ENTRY& column : TextColumns())
        if (const std::string missing = WhatIsMissing(column); !missing.empty())
            Tell(line, "the heading has no column " + missing);
    understood_ = wrong_.empty();
}

// The name of a needed column that the heading has not, and a hint; else empty.
std::string CsvImport::WhatIsMissing(const COLUMN_ENTRY& column) const {
    const auto renamed = options_.headers.find(column.name);
    const bool wanted = renamed != options_.headers.end() && !renamed->second.empty();
    const bool needed = wanted || IsColumn(column, options_.updateByTicker ? TickerAt : NameAt) ||
                        (options_.portfolio.empty() && IsColumn(column, PortfolioAt));
    if (!needed || PlaceOf(static_cast<std::size_t>(column.offset)) < targets_.size())
        return {};
    if (targets_.size() == 1)
        return Quoted(wanted ? renamed->second : column.name) + "; is there another --delimiter?";
    if (wanted)
        return Quoted(renamed->second);
    return Quoted(column.name) + "; is there another name for --column " + column.name + "=NAME?";
}

CsvImport::Target CsvImport::TargetOf(const std::string& heading) const {
    Target target;
    for (const COLUMN_ENTRY& column : TextColumns()) {
        const auto renamed = options_.headers.find(column.name);
        const bool own = renamed == options_.headers.end();
        const std::string wanted = own ? column.name : renamed->second;
        if (heading.empty() || strcmpi(wanted.c_str(), heading.c_str()) != 0)
            continue;
        if (!own) // which goes before the column that is called so
            return {&column, column.name + (" (" + Quoted(heading) + ")")};
        target = {&column, column.name};
    }
    return target;
}

// The number of targets when the table has no such column.
std::size_t CsvImport::PlaceOf(std::size_t offset) const {
    const auto found = std::find_if(targets_.begin(), targets_.end(), [offset](const Target& target) {
        return target.column && IsColumn(*target.column, offset);
    });
    return static_cast<std::size_t>(found - targets_.begin());
}

void CsvImport::TakeRow(long line, const std::vector<std::string>& fields) {
    if (fields.size() != targets_.size()) {
        Tell(line, Counted(static_cast<std::int64_t>(fields.size()), "field") + ", the heading has " +
                       std::to_string(targets_.size()));
        return;
    }
    const std::size_t before = wrong_.size();
    const std::string portfolio = PortfolioOf(line, fields);
    const auto named =
        std::count_if(fields.begin(), fields.end(), [](const std::string& field) { return !field.empty(); });
    if (portfolio.empty() || (options_.portfolio.empty() && named == 1))
        return;
    ImportedInvestment row;
    row.line = line;
    CopyTextZeroed(row.data.Portfolio, portfolio);
    row.data.PrevPrice = NoPreviousPrice;
    if (PlaceOf(RiskAt) == targets_.size())
        CopyText(row.data.Risk, "Med"); // as the window's form begins
    if (options_.updateByTicker)
        BeginWithRecord(portfolio, fields[PlaceOf(TickerAt)], &row);
    const dbDATE today = Today();
    row.data.Date = today;
    StoreFields(fields, &row);
    row.data.Value = row.data.Shares * row.data.Price;
    if (wrong_.size() != before)
        return;
    if (IsBlank(FieldText(row.data.Name)))
        Tell(line, "Name: there is none");
    else if (!std::isfinite(row.data.Value))
        Tell(line, "Value: shares times price is too large a number");
    else
        (row.record < 0 ? added_ : changed_).push_back(row);
    if (PackDate(row.data.Date) > PackDate(today))
        ahead_.push_back(line);
}

std::string CsvImport::PortfolioOf(long line, const std::vector<std::string>& fields) {
    const std::size_t place = PlaceOf(PortfolioAt);
    const std::string text = place < fields.size() ? fields[place] : "";
    if (options_.portfolio.empty()) {
        const std::string wrong = text.empty() ? "the line names none" : MakeKnown(text);
        if (!wrong.empty())
            Tell(line, "Portfolio: " + wrong);
        return wrong.empty() ? text : "";
    }
    if (!text.empty() && strcmpi(text.c_str(), options_.portfolio.c_str()) != 0)
        Tell(line, "Portfolio: " + Quoted(text) + " is another one; --all imports each line into its own");
    return options_.portfolio;
}

void CsvImport::BeginWithRecord(const std::string& portfolio, const std::string& ticker,
                                ImportedInvestment* row) {
    Holding& holding = tickers_[KeyOf(portfolio, ticker)];
    std::string wrong;
    if (WithoutBlanks(ticker).empty())
        wrong = "is empty, and tells the investment";
    else if (holding.line > 0)
        wrong = "stands in line " + std::to_string(holding.line) + " already";
    else if (holding.count > 1)
        wrong = "is that of " + std::to_string(holding.count) + " investments";
    else if (holding.count == 1 && !ReadInvestment(investments_, holding.record, &row->data))
        wrong = "is that of a record that cannot be read";
    if (!wrong.empty())
        Tell(row->line, targets_[PlaceOf(TickerAt)].label + ": " + Quoted(ticker) + " " + wrong);
    holding.line = row->line;
    row->record = holding.record;
}

void CsvImport::StoreFields(const std::vector<std::string>& fields, ImportedInvestment* row) {
    for (std::size_t i = 0; i < fields.size(); ++i) {
        const COLUMN_ENTRY* column = targets_[i].column;
        if (!column || fields[i].empty() || IsColumn(*column, PortfolioAt) || IsColumn(*column, ValueAt))
            continue;
        const bool isKey = options_.updateByTicker && IsColumn(*column, TickerAt);
        const std::string wrong =
            column->type == ColumnType::String
                ? StoreText(*column, isKey ? std::string(WithoutBlanks(fields[i])) : fields[i], &row->data)
                : StoreFigure(*column, WithoutBlanks(fields[i]), options_.decimal, &row->data);
        if (!wrong.empty())
            Tell(row->line, targets_[i].label + ": " + Quoted(fields[i]) + " " + wrong);
    }
}

bool CsvImport::WriteInvestments(DATABASE& investments) const {
    for (const ImportedInvestment& each : changed_)
        if (investments.Write(each.record, &each.data) != 0)
            return false;
    return added_.empty() || investments.AppendAll(&added_.front().data, sizeof(ImportedInvestment),
                                                   static_cast<std::int32_t>(added_.size())) >= 0;
}

std::string CsvImport::Write(const ToolFolder& folder, FileOperations& operations) const {
    DataFileCopy investments(folder, InvestmentFile, operations);
    DataFileCopy portfolios(folder, PortfolioFile, operations);
    std::string wrong = Prepare(investments, [&](DATABASE& data) { return WriteInvestments(data); });
    if (wrong.empty() && !newPortfolios_.empty())
        wrong = Prepare(portfolios, [&](DATABASE& data) {
            return std::all_of(newPortfolios_.begin(), newPortfolios_.end(),
                               [&](const std::string& name) { return AddPortfolio(data, name.c_str()); });
        });
    std::string unsure;
    if (wrong.empty() && !newPortfolios_.empty())
        wrong = portfolios.TakePlace(&unsure);
    if (wrong.empty())
        if (wrong = investments.TakePlace(&unsure); !wrong.empty() && !newPortfolios_.empty())
            wrong += "; the new portfolios are listed, and the same import brings their investments";
    return wrong.empty() ? unsure : wrong;
}
