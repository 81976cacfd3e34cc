#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "TemporaryFolder.h"
#include "app/model/RecordLayouts.h"
#include "db/Database.h"
#include "util/CharacterBuffer.h"

// An investment with something in every field.
inline INVESTMENT_DATA MakeInvestment(std::string_view portfolio, std::string_view name, float shares = 2,
                                      float price = 10, std::string_view type = "Fund") {
    INVESTMENT_DATA record{};
    CopyText(record.Portfolio, portfolio);
    CopyText(record.Name, name);
    CopyText(record.Ticker, "TICK");
    CopyText(record.Type, type);
    CopyText(record.Risk, "Med");
    CopyText(record.Agent, "Bank");
    record.Shares = shares;
    record.Price = price;
    record.PrevPrice = NoPreviousPrice;
    record.Value = shares * price;
    record.Date = {3, 3, 2001};
    return record;
}

// A program's folder of the test's own, with the three data files, all empty, and a settings file.
class DataFolder : public TemporaryFolder {
  public:
    DataFolder() {
        Create("portfol.db", PortfolioColumns);
        Create("invest.db", InvestmentColumns);
        Create("misc.db", CategoryColumns);
        Write("Quorvan.ini", "[GENERAL]\n[DISPLAY]\n");
    }

    void AddPortfolio(std::string_view name) const {
        PORTFOLIO_DATA record{};
        CopyText(record.Name, name);
        DATABASE(File("portfol.db").c_str()).Append(&record);
    }
    long AddInvestment(const INVESTMENT_DATA& record) const {
        return DATABASE(File("invest.db").c_str()).Append(&record);
    }
    // "portfolio/name" of every investment in the file, or the names of the portfolios, in record order.
    std::vector<std::string> Investments() const {
        return All<INVESTMENT_DATA>(
            "invest.db",
            [](const INVESTMENT_DATA& record) { return std::string(record.Portfolio) + "/" + record.Name; });
    }
    std::vector<std::string> Portfolios() const {
        return All<PORTFOLIO_DATA>(
            "portfol.db", [](const PORTFOLIO_DATA& record) { return record.Name; });
    }
    // Records in the file, deleted ones included.
    std::int32_t RecordSlots(const std::string& file) const {
        DATABASE_HEADER header{};
        DATABASE(File(file).c_str()).GetHeaderInfo(&header);
        return header.recordCount;
    }

  private:
    template <class Record, class ToText>
    std::vector<std::string> All(const char* name, ToText text) const {
        std::vector<std::string> all;
        DATABASE file(File(name).c_str());
        for (const void* data = file.QueryGetFirst(nullptr); data; data = file.QueryGetNext(nullptr))
            all.emplace_back(text(*static_cast<const Record*>(data)));
        return all;
    }
    template <std::size_t Count>
    void Create(const char* name, const std::array<COLUMN_ENTRY, Count>& columns) const {
        if (DATABASE(nullptr).Create(File(name).c_str(), name, Count, columns.data()) != 0)
            throw std::runtime_error(name);
    }
};
