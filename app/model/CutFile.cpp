#include "app/model/CutFile.h"

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <vector>

#include "app/model/PortfolioRules.h"
#include "db/Database.h"

namespace {

struct [[gnu::packed]] CutData {
    INVESTMENT_DATA investment;
    std::int32_t record; // its number in invest.db
};

// An investment's columns, and the rest of its struct, so that nothing of it is lost.
std::vector<COLUMN_ENTRY> Columns() {
    std::vector<COLUMN_ENTRY> columns(InvestmentColumns.begin(), InvestmentColumns.end());
    columns.push_back({"Unused", ColumnType::String, sizeof(INVESTMENT_DATA::Unused), 0, 0});
    columns.push_back({"Record", ColumnType::Long, sizeof(CutData::record), 0, 0});
    return columns;
}

bool ReadAll(const std::string& path, std::vector<CutData>* kept) {
    DATABASE file(path.c_str());
    DATABASE_HEADER header{};
    file.GetHeaderInfo(&header);
    if (!file.IsOpen() || file.IsDamaged() || header.recordLength != sizeof(CutData) + 1)
        return false;
    kept->resize(static_cast<std::size_t>(header.recordCount));
    for (std::size_t i = 0; i < kept->size(); ++i)
        if (file.Read(static_cast<long>(i), &(*kept)[i]) != 1)
            return false;
    return true;
}

} // namespace

bool CutFile::Keep(std::span<const INVESTMENT_DATA> investments, std::span<const long> numbers) const {
    std::vector<CutData> records(investments.size());
    for (std::size_t i = 0; i < records.size(); ++i)
        records[i] = {investments[i], static_cast<std::int32_t>(numbers[i])};
    std::error_code error;
    if (std::filesystem::exists(path_, error) || error)
        return false;
    // Under its own name only when it is whole.
    const std::string unfinished = path_ + ".tmp";
    std::filesystem::remove(unfinished, error);
    const std::vector<COLUMN_ENTRY> columns = Columns();
    DATABASE file(nullptr, operations_);
    if (file.Create(unfinished.c_str(), "cut investments", static_cast<int>(columns.size()),
                    columns.data()) == 0 &&
        file.AppendAll(records.data(), sizeof(CutData), static_cast<std::int32_t>(records.size())) >= 0 &&
        file.Sync() == 0 && RenameFile(operations_, unfinished, path_) == 0 &&
        SyncFolderOf(operations_, path_) == 0)
        return true;
    std::filesystem::remove(unfinished, error);
    std::filesystem::remove(path_, error);
    return false;
}

void CutFile::Forget() const {
    // Back after a power cut it would only bring the investments a second time.
    if (RemoveFile(operations_, path_) == 0)
        static_cast<void>(SyncFolderOf(operations_, path_));
}

CutFile::Outcome CutFile::Restore(DATABASE& investments) const {
    std::error_code error;
    if (!std::filesystem::exists(path_, error))
        return Outcome::NothingKept;
    std::vector<CutData> kept;
    if (!ReadAll(path_, &kept))
        return Outcome::Failed;
    std::vector<INVESTMENT_DATA> lost;
    for (const CutData& each : kept) {
        INVESTMENT_DATA present;
        const bool read = ReadInvestment(investments, each.record, &present);
        if (!read && investments.GetLastError(nullptr) == DatabaseError::ReadFailed)
            return Outcome::Failed; // it may be there
        if (!read || !AreSame(present, each.investment))
            lost.push_back(each.investment);
    }
    if (investments.AppendAll(lost.data(), sizeof(INVESTMENT_DATA), static_cast<std::int32_t>(lost.size())) <
            0 ||
        investments.Sync() != 0)
        return Outcome::Failed;
    Forget();
    return Outcome::Restored;
}
