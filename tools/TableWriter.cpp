#include "tools/TableWriter.h"

#include <algorithm>
#include <cerrno>
#include <charconv>
#include <cmath>
#include <iterator>
#include <nlohmann/json.hpp>
#include <ostream>
#include <set>
#include <unistd.h>

#include "util/Numbers.h"
#include "util/Strings.h"
#include "util/Utf8.h"

namespace {

constexpr std::size_t PieceSize = std::size_t{256} * 1024;

// The shortest text that reads back as the same number, without an exponent as long as that is no burden.
void AppendShortest(std::string& out, float value) {
    value = std::isnan(value) ? std::fabs(value) : value; // without a sign, as everywhere
    constexpr float large = 1e9F;
    constexpr float small = 1e-4F;
    const float size = std::fabs(value);
    const bool plain = size == 0 || (size >= small && size < large);
    char buffer[64];
    char* const end = plain ? std::to_chars(buffer, std::end(buffer), value, std::chars_format::fixed).ptr
                            : std::to_chars(buffer, std::end(buffer), value).ptr;
    out.append(&buffer[0], end);
}

void AppendCsv(std::string& out, std::string_view text) {
    // Blanks at the ends are often dropped without quotation marks.
    if (text.find_first_of("\",\r\n") == text.npos && text.find_first_of(" \t") != 0 &&
        (text.empty() || text.find_last_of(" \t") != text.size() - 1)) {
        out += text;
        return;
    }
    out += '"';
    for (const char each : text)
        out.append(each == '"' ? 2 : 1, each);
    out += '"';
}

bool IsNumber(const Cell& cell) {
    return cell.kind == Cell::Kind::Figure || cell.kind == Cell::Kind::Number ||
           cell.kind == Cell::Kind::Float;
}

} // namespace

void TextOutput::Write(std::string_view text) {
    kept_ += text;
    if (descriptor_ >= 0 && kept_.size() >= PieceSize)
        Flush();
}

int TextOutput::Flush() {
    std::string_view rest = kept_;
    while (error_ == 0 && !rest.empty()) {
        const ssize_t written = write(descriptor_, rest.data(), rest.size());
        if (written >= 0)
            rest.remove_prefix(static_cast<std::size_t>(written));
        else if (errno != EINTR)
            error_ = errno;
    }
    kept_.clear();
    return error_;
}

int FinishOutput(TextOutput& output, std::ostream& errors, int status) {
    const int error = output.Flush();
    if (error == 0 || error == EPIPE)
        return status;
    errors << "quorvan-cli: the output cannot be written: " << Reason(error) << '\n';
    return 1;
}

void Cell::SetText(std::string_view bytes) {
    kind = Kind::Text;
    text = bytes;
}

void Cell::SetNumber(std::int64_t whole) {
    kind = Kind::Number;
    number = whole;
}

void Cell::SetFloat(float single, int shownDecimals) {
    kind = Kind::Float;
    value = single;
    decimals = shownDecimals;
}

// An object whose members keep their order, and whose values are replaced row by row.
class TableWriter::JsonLine {
  public:
    explicit JsonLine(const std::vector<std::string>& names) {
        std::set<std::string> taken;
        for (const std::string& name : names) {
            std::string unique = name;
            for (int number = 2; !taken.insert(unique).second; ++number)
                unique = name + "_" + std::to_string(number);
            object_.get_ref<Json::object_t&>().emplace_back(unique, nullptr);
        }
    }

    [[nodiscard]] std::string Text(std::span<const Cell> row) {
        auto member = object_.begin();
        for (const Cell& cell : row)
            *member++ = ValueOf(cell);
        return object_.dump(-1, ' ', false, Json::error_handler_t::replace) + '\n';
    }

  private:
    // Floats are single, so that 0.1 is written as 0.1.
    using Json = nlohmann::basic_json<nlohmann::ordered_map, std::vector, std::string, bool, std::int64_t,
                                      std::uint64_t, float>;

    static Json ValueOf(const Cell& cell) {
        switch (cell.kind) {
        case Cell::Kind::Text:
        case Cell::Kind::Figure:
            return cell.text;
        case Cell::Kind::Number:
            return cell.number;
        case Cell::Kind::Float:
            return cell.value;
        case Cell::Kind::Truth:
            return cell.number != 0;
        case Cell::Kind::Nothing:
            break;
        }
        return nullptr;
    }

    Json object_ = Json::object();
};

TableWriter::TableWriter(OutputFormat format, const std::vector<std::string>& names, TextOutput& output)
    : format_(format), right_(names.size(), false), output_(output) {
    for (const std::string& name : names) {
        AppendEscaped(names_.emplace_back(), name);
        widths_.push_back(DisplayWidth(names_.back()));
    }
    if (format == OutputFormat::Json)
        json_ = std::make_unique<JsonLine>(names);
}

TableWriter::~TableWriter() = default;

// The cell's text, save in JSON.
void TableWriter::Render(const Cell& cell) {
    char buffer[64];
    field_.clear();
    switch (cell.kind) {
    case Cell::Kind::Text:
    case Cell::Kind::Figure:
        if (format_ == OutputFormat::Csv)
            AppendCsv(field_, cell.text);
        else
            AppendEscaped(field_, cell.text);
        break;
    case Cell::Kind::Number:
        field_.append(buffer, std::to_chars(buffer, std::end(buffer), cell.number).ptr);
        break;
    case Cell::Kind::Float:
        if (format_ == OutputFormat::Table && FormatFixed(cell.value, buffer, sizeof(buffer), cell.decimals))
            field_ = buffer;
        else
            AppendShortest(field_, cell.value);
        break;
    case Cell::Kind::Truth:
        field_ = cell.number != 0 ? "yes" : "no";
        break;
    case Cell::Kind::Nothing:
        break;
    }
}

void TableWriter::Measure(std::span<const Cell> row) {
    for (std::size_t i = 0; format_ == OutputFormat::Table && i < row.size(); ++i) {
        Render(row[i]);
        widths_[i] = std::max(widths_[i], DisplayWidth(field_));
        right_[i] = IsNumber(row[i]);
    }
}

void TableWriter::WriteHeading() {
    line_.clear();
    for (std::size_t i = 0; i < names_.size(); ++i) {
        field_ = names_[i];
        AppendAligned(i, right_[i], i + 1 == names_.size());
    }
    if (format_ != OutputFormat::Json)
        WriteLine();
}

void TableWriter::WriteLine() {
    output_.Write(line_ += format_ == OutputFormat::Csv ? "\r\n" : "\n");
}

void TableWriter::WriteRow(std::span<const Cell> row) {
    if (json_) {
        output_.Write(json_->Text(row));
        return;
    }
    line_.clear();
    for (std::size_t i = 0; i < row.size(); ++i) {
        Render(row[i]);
        AppendAligned(i, IsNumber(row[i]), i + 1 == row.size());
    }
    WriteLine();
}

// Appends the text of the cell at hand, and what separates it from the next.
void TableWriter::AppendAligned(std::size_t column, bool toTheRight, bool last) {
    if (format_ != OutputFormat::Table) {
        line_ += field_;
        if (!last)
            line_ += format_ == OutputFormat::Csv ? ',' : '\t';
        return;
    }
    const std::size_t width = DisplayWidth(field_);
    const std::size_t padding = widths_[column] > width ? widths_[column] - width : 0;
    line_.append(toTheRight ? padding : 0, ' ');
    line_ += field_;
    line_.append(toTheRight ? 0 : padding, ' ');
    line_ += "  ";
    if (last)
        line_.erase(line_.find_last_not_of(' ') + 1);
}

void WriteRows(OutputFormat format, const std::vector<std::string>& names,
               const std::vector<std::vector<Cell>>& rows, TextOutput& output) {
    TableWriter writer(format, names, output);
    for (const std::vector<Cell>& row : rows)
        writer.Measure(row);
    writer.WriteHeading();
    for (const std::vector<Cell>& row : rows)
        writer.WriteRow(row);
}
