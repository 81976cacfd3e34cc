#pragma once

#include <functional>
#include <map>
#include <set>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "app/model/RecordLayouts.h"
#include "db/Database.h"
#include "tools/ToolFolder.h"

// How a table of investments is read.
struct ImportOptions {
    std::string portfolio;                      // empty: each line names its own
    std::map<std::string, std::string> headers; // what the table calls a column; "" for one not to be read
    char delimiter = ',';
    char decimal = 0; // as ReadPlainNumber takes it
    bool create = false;
    bool updateByTicker = false;
};

// An investment as it will be once its line came in.
struct ImportedInvestment {
    long line = 0;
    long record = -1; // the one that the line changes; -1 for a new one
    INVESTMENT_DATA data{};
};

// Makes investments of a table (CSV): finds the columns by the heading, and makes of each line a record with
// Value, and what the line does not say, as the window would set it. An empty field is one that the line does
// not have, but for Risk, which can be empty. It judges every line and changes no file, until it is asked to
// write what it read.
//
// A command owns it for one table, on one thread.
class CsvImport {
  public:
    // The files, which may be open for looking only, must outlive the object.
    CsvImport(ImportOptions options, DATABASE& portfolios, DATABASE& investments);

    // Reads the whole table; `tell` is called with the number of each line. Returns an empty text, or what
    // hinders it before any line does.
    [[nodiscard]] std::string Read(std::string_view text, const std::function<void(long line)>& tell);

    // Where the table is wrong, and why: "line 3: Price: '5,5' is no number". Empty when nothing is.
    [[nodiscard]] const std::vector<std::string>& Wrong() const { return wrong_; }
    // The headings of which nothing is taken.
    [[nodiscard]] const std::vector<std::string>& Unused() const { return unused_; }
    // The lines of which the date lies ahead.
    [[nodiscard]] const std::vector<long>& Ahead() const { return ahead_; }
    [[nodiscard]] const std::vector<std::string>& NewPortfolios() const { return newPortfolios_; }
    [[nodiscard]] const std::vector<ImportedInvestment>& Added() const { return added_; }
    [[nodiscard]] const std::vector<ImportedInvestment>& Changed() const { return changed_; }

    // Writes it into the folder, which is locked and backed up: all of it or, when that fails or the process
    // is killed, nothing but new portfolios, without investments at most. They come first, so that none is
    // lost and the same import, once more, brings all in. Returns an empty text, or what hinders it.
    [[nodiscard]] std::string Write(const ToolFolder& folder,
                                    FileOperations& operations = SystemFiles()) const;

  private:
    // Where a field of a row goes.
    struct Target {
        const COLUMN_ENTRY* column = nullptr; // null: nowhere
        std::string label;
    };
    // Who has a ticker.
    struct Holding {
        long record = -1;
        long count = 0;
        long line = 0; // of the table
    };

    [[nodiscard]] bool ReadPresent();
    // Makes a portfolio one of those that lines can name. Returns what hinders it.
    [[nodiscard]] std::string MakeKnown(const std::string& portfolio);
    void TakeHeading(long line, const std::vector<std::string>& fields);
    [[nodiscard]] std::string WhatIsMissing(const COLUMN_ENTRY& column) const;
    [[nodiscard]] Target TargetOf(const std::string& heading) const;
    [[nodiscard]] std::size_t PlaceOf(std::size_t offset) const;
    void TakeRow(long line, const std::vector<std::string>& fields);
    // Empty, and told, when it is wrong.
    [[nodiscard]] std::string PortfolioOf(long line, const std::vector<std::string>& fields);
    // Lets the row begin as the record with this ticker, if there is one.
    void BeginWithRecord(const std::string& portfolio, const std::string& ticker, ImportedInvestment* row);
    void StoreFields(const std::vector<std::string>& fields, ImportedInvestment* row);
    [[nodiscard]] bool WriteInvestments(DATABASE& investments) const;
    void Tell(long line, const std::string& wrong);

    ImportOptions options_;
    DATABASE& portfolios_;
    DATABASE& investments_;
    std::set<std::string> known_; // portfolios, in small letters
    std::set<std::string> held_;  // those with investments
    std::unordered_map<std::string, Holding> tickers_;

    std::vector<Target> targets_; // for each field of a row
    bool understood_ = false;     // the heading
    std::vector<std::string> wrong_;
    std::vector<std::string> unused_;
    std::vector<long> ahead_;
    std::vector<std::string> newPortfolios_;
    std::vector<ImportedInvestment> added_;
    std::vector<ImportedInvestment> changed_;
};
