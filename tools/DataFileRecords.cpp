// What DataFileTool does with records: show, change and mark them.
#include <algorithm>
#include <cerrno>
#include <cstring>

#include "db/Statement.h"
#include "tools/DataFileTool.h"
#include "tools/RecordFields.h"
#include "tools/Sentences.h"

namespace {

// Stores a value in a record's data. Returns a sentence about what is wrong with it, or nothing.
std::string StoreIn(const COLUMN_ENTRY& column, const std::string& value, std::uint8_t* data) {
    const std::string wrong = StoreField(column, value, data);
    return wrong.empty() ? wrong : std::string(column.name) + ": '" + value + "' " + wrong;
}

} // namespace

bool DataFileTool::Select(const Selection& selection) {
    database_.SetCaseSensitivity(selection.exact ? 1 : 0);
    long count = database_.Query(selection.statement.c_str(), QueryMode::New);
    for (std::size_t i = 0; i < selection.further.size() && count >= 0; ++i) {
        const auto& [mode, statement] = selection.further[i];
        count = database_.Query(statement.c_str(), mode);
    }
    return count >= 0 &&
           (selection.sortColumn.empty() || database_.SortBy(selection.sortColumn.c_str(), 0) == 0);
}

int DataFileTool::Query(const Selection& selection) {
    if (!Open(Access::Read))
        return 1;
    return Select(selection) ? PrintSet() : FailAsEngine();
}

// Walks the selected records as long as somebody takes the output. Returns an exit status.
int DataFileTool::WalkSet(const std::function<void(long, const std::uint8_t*)>& use) {
    long number = 0;
    database_.GetLastError(nullptr);
    for (void* data = database_.QueryGetFirst(&number); data != nullptr && output_.IsWorking();
         data = database_.QueryGetNext(&number))
        use(number, static_cast<const std::uint8_t*>(data));
    const int code = database_.GetLastError(nullptr);
    return code == 0 ? 0 : FailWithCode(code);
}

int DataFileTool::PrintSet() {
    const std::vector<COLUMN_ENTRY> columns = AllColumns();
    std::vector<std::string> names = {"record"};
    for (const COLUMN_ENTRY& column : columns)
        names.emplace_back(column.name);
    TableWriter writer(format_, names, output_);
    std::vector<Cell> row(names.size());
    const auto fill = [&](long number, const std::uint8_t* data) {
        row[0].SetNumber(number);
        for (std::size_t i = 0; i < columns.size(); ++i)
            FillCell(columns[i], data, &row[i + 1]);
    };
    int status = 0;
    if (format_ == OutputFormat::Table)
        status = WalkSet([&](long number, const std::uint8_t* data) {
            fill(number, data);
            writer.Measure(row);
        });
    if (status != 0)
        return status;
    writer.WriteHeading();
    return WalkSet([&](long number, const std::uint8_t* data) {
        fill(number, data);
        writer.WriteRow(row);
    });
}

int DataFileTool::Set(const std::string& statement, const Selection& selection) {
    if (!Open(Access::Change))
        return 1;
    Statement parts{};
    if (SplitStatement(statement.c_str(), &parts) && std::strcmp(parts.op, "=") == 0) {
        for (const COLUMN_ENTRY& column : AllColumns())
            if (std::string_view(column.name) == parts.column)
                return SetValue(column, parts.value, selection);
    }
    if (!Select(selection))
        return FailAsEngine();
    const long changed = database_.QueryUpdate(statement.c_str());
    if (changed < 0)
        return FailAsEngine();
    Tell("changed", changed, Counted(changed, "record") + " changed");
    return 0;
}

// Sets a column to what Append would store. The engine's statement would store something else for a value
// that the column cannot hold, and a day that exists for no date.
int DataFileTool::SetValue(const COLUMN_ENTRY& column, const std::string& value, const Selection& selection) {
    std::vector<std::uint8_t> wanted = EmptyData();
    if (const std::string wrong = StoreIn(column, value, wanted.data()); !wrong.empty())
        return Fail(wrong);
    std::vector<std::uint8_t> data = EmptyData();
    const auto set = [&](long number) {
        if (database_.UnBufferedRead(number, data.data()) != 1)
            return -1;
        std::copy_n(wanted.begin() + column.offset, column.size, data.begin() + column.offset);
        return database_.Write(number, data.data());
    };
    return Apply("changed", set, {}, &selection);
}

std::vector<std::uint8_t> DataFileTool::EmptyData() const {
    DATABASE_HEADER header{};
    database_.GetHeaderInfo(&header);
    return std::vector<std::uint8_t>(static_cast<std::size_t>(header.recordLength));
}

int DataFileTool::Append(const std::vector<std::string>& values) {
    if (!Open(Access::Change))
        return 1;
    const std::vector<COLUMN_ENTRY> columns = AllColumns();
    std::vector<std::uint8_t> data = EmptyData();
    std::vector<bool> given(columns.size(), false);
    for (const std::string& value : values)
        if (const std::string wrong = StoreValue(columns, value, given, data.data()); !wrong.empty())
            return Fail(wrong);
    const long number = database_.Append(data.data());
    if (number < 0)
        return FailAsEngine();
    Tell("record", number, "record " + std::to_string(number) + " appended");
    return 0;
}

// Stores NAME=VALUE. Returns what is wrong with it, or nothing.
std::string DataFileTool::StoreValue(const std::vector<COLUMN_ENTRY>& columns, const std::string& assignment,
                                     std::vector<bool>& given, std::uint8_t* data) const {
    // A name may have a "=" in it: the longest one that fits is meant.
    const auto lengthIn = [&assignment](const COLUMN_ENTRY& column) {
        const std::string start = std::string(column.name) + "=";
        return assignment.compare(0, start.size(), start) == 0 ? start.size() : 0;
    };
    std::size_t best = 0;
    for (std::size_t i = 1; i < columns.size(); ++i)
        best = lengthIn(columns[i]) > lengthIn(columns[best]) ? i : best;
    const std::size_t length = columns.empty() ? 0 : lengthIn(columns[best]);
    if (length == 0)
        return "'" + assignment + "' begins with no column's name; `columns` lists them";
    if (given[best])
        return std::string("the column ") + columns[best].name + " is given twice";
    given[best] = true;
    return StoreIn(columns[best], assignment.substr(length), data);
}

int DataFileTool::Mark(const char* done, int (DATABASE::*mark)(long), const std::vector<long>& records,
                       const Selection* selection) {
    const auto apply = [&](long number) { return (database_.*mark)(number); };
    return Open(Access::Change) ? Apply(done, apply, records, selection) : 1;
}

int DataFileTool::Apply(const char* done, const std::function<int(long)>& apply, std::vector<long> records,
                        const Selection* selection) {
    if (selection != nullptr) {
        if (!Select(*selection))
            return FailAsEngine();
        if (WalkSet([&records](long number, const std::uint8_t*) { records.push_back(number); }) != 0)
            return 1;
    }
    int status = 0;
    long count = 0;
    for (const long number : records) {
        errno = 0;
        if (apply(number) == 0) {
            ++count;
            continue;
        }
        const int code = database_.GetLastError(nullptr);
        status = FailWithCode(code, "record " + std::to_string(number) + ": ");
        if (IsFileFailure(code))
            break;
    }
    Tell(done, count, Counted(count, "record") + " " + done);
    return status;
}
