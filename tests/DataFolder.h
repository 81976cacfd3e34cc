#pragma once

#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "TemporaryFolder.h"
#include "app/model/RecordLayouts.h"
#include "db/Database.h"
#include "util/CharacterBuffer.h"

// An investment with something in every field.
inline INVESTMENT_DATA MakeInvestment(std::string_view portfolio, std::string_view name, float shares = 2,
                                      float price = 10, std::string_view type = "Fund",
                                      std::string_view ticker = "TICK", std::string_view risk = "Med") {
    INVESTMENT_DATA record{};
    CopyText(record.Portfolio, portfolio);
    CopyText(record.Name, name);
    CopyText(record.Ticker, ticker);
    CopyText(record.Type, type);
    CopyText(record.Risk, risk);
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
    std::vector<std::string> Investments() const { return All("invest.db", 2); }
    std::vector<std::string> Portfolios() const { return All("portfol.db", 1); }

  private:
    // The names that each record begins with.
    std::vector<std::string> All(const char* name, int names) const {
        std::vector<std::string> all;
        DATABASE file(File(name).c_str());
        for (const void* data = file.QueryGetFirst(nullptr); data; data = file.QueryGetNext(nullptr)) {
            const auto* first = static_cast<const char*>(data);
            all.push_back(names == 1 ? first : first + ("/" + std::string(first + NameSize)));
        }
        return all;
    }
    void Create(const char* name, std::span<const COLUMN_ENTRY> columns) const {
        DATABASE(nullptr).Create(File(name).c_str(), name, static_cast<int>(columns.size()), columns.data());
    }
};
