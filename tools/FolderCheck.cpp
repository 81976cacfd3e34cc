#include "tools/FolderCheck.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <map>
#include <set>

#include "app/model/PortfolioRules.h"
#include "db/Database.h"
#include "db/FileCheck.h"
#include "tools/Sentences.h"
#include "util/Dates.h"
#include "util/Strings.h"

namespace {

using Kind = FolderFinding::Kind;

std::string Text(float number) {
    char buffer[64];
    return {&buffer[0], std::to_chars(buffer, std::end(buffer), number).ptr};
}

} // namespace

bool FolderCheck::IsSound() const {
    return std::none_of(
        findings_.begin(), findings_.end(),
        [](const FolderFinding& finding) { return finding.kind == Kind::Problem; });
}

std::string FolderCheck::Run(bool repair) {
    std::unique_ptr<DATABASE> portfolios;
    std::unique_ptr<DATABASE> investments;
    std::unique_ptr<DATABASE> categories;
    std::string wrong = folder_.WhyNotThere();
    wrong = wrong.empty() ? CheckFile(PortfolioFile, repair, &portfolios) : wrong;
    wrong = wrong.empty() ? CheckFile(InvestmentFile, repair, &investments) : wrong;
    wrong = wrong.empty() ? CheckFile(CategoryFile, repair, &categories) : wrong;
    if (!wrong.empty() || !portfolios || !investments)
        return wrong;
    wrong = CheckTogether(*portfolios, *investments);
    return wrong.empty() && repair ? Mend(*portfolios, *investments) : wrong;
}

std::string FolderCheck::CheckFile(const DataFileKind& kind, bool repair, std::unique_ptr<DATABASE>* opened) {
    const std::string path = folder_.PathOf(kind);
    const auto add = [&](Kind what, const std::string& text, std::int64_t offset = -1,
                         std::int64_t record = -1) {
        findings_.push_back({what, kind.name, offset, record, text});
    };
    if (repair && RestoreCompactionBackup(path.c_str(), operations_) > 0)
        add(Kind::Mended, "the backup of an interrupted compaction got back its name");
    FileCheck check(operations_);
    const bool read = check.Run(path) == 0;
    const bool sound = read && check.IsSound();
    const std::vector<FileFinding> findings = check.Findings();
    const bool mends = repair && check.CanRepair();
    std::string wrong = mends ? folder_.KeepBackup() : "";
    std::string copy;
    if (const int error = mends && wrong.empty() ? check.Repair(path, &copy) : 0; error != 0)
        wrong = "the counts of " + path + " cannot be mended: " + Reason(error);
    for (const FileFinding& each : findings)
        add(!each.problem                             ? Kind::Remark
            : mends && wrong.empty() && each.mendable ? Kind::Mended
                                                      : Kind::Problem,
            each.text, each.offset, each.record);
    if (!wrong.empty())
        return wrong;
    *opened = folder_.Open(kind, repair ? DataFileUse::Change : DataFileUse::Look, wrong);
    if (!*opened && (sound || !read))
        add(Kind::Problem, wrong);
    return {};
}

std::string FolderCheck::CheckTogether(DATABASE& portfolios, DATABASE& investments) {
    std::vector<std::string> names;
    std::set<std::string> listed;
    struct Orphans {
        long first;
        long count;
        std::string name;
    };
    std::map<std::string, Orphans> orphans;
    bool read = CollectPortfolios(portfolios, &names);
    for (const std::string& name : names)
        listed.insert(Lowered(name));
    read = ForEachInvestment(investments, investments.Query(nullptr, QueryMode::New),
                             [&](const INVESTMENT_DATA& record, long number) {
                                 const std::string name(FieldText(record.Portfolio));
                                 const std::string key = Lowered(name);
                                 if (!listed.contains(key))
                                     ++orphans.try_emplace(key, Orphans{number, 0, name}).first->second.count;
                                 CheckInvestment(record, number);
                             }) &&
           read;
    for (const auto& [key, each] : orphans) {
        lost_.push_back({each.name, findings_.size()});
        Add(Kind::Problem, each.first,
            Counted(each.count, "investment") + " from here on of " + Quoted(each.name) +
                ", which is no portfolio of the list");
    }
    return read ? "" : "the portfolios and their investments could not all be read";
}

void FolderCheck::CheckInvestment(const INVESTMENT_DATA& record, long number) {
    const float shares = record.Shares;
    const float price = record.Price;
    const float value = record.Value;
    if (!std::isfinite(shares * price)) {
        Add(Kind::Problem, number, "Shares times Price is no number that Value can be");
    } else if (value != shares * price) {
        wrongValues_.push_back({number, findings_.size()});
        Add(Kind::Problem, number,
            "Value is " + Text(value) + ", and Shares times Price " + Text(shares * price));
    }
    if (!RiskIndex(FieldText(record.Risk)))
        Add(Kind::Problem, number,
            "Risk is " + Quoted(FieldText(record.Risk)) +
                ", which no chart counts, and none of Low, Med and High");
    JudgeDate(record.Date, number);
}

void FolderCheck::JudgeDate(const dbDATE& date, long number) {
    const std::string text =
        std::to_string(date.year) + "-" + std::to_string(date.month) + "-" + std::to_string(date.day);
    if (PackDate(date) == 0)
        Add(Kind::Problem, number, "there is no Date");
    else if (CheckDate(date.year, date.month, date.day) != 0)
        Add(Kind::Problem, number, "Date is " + text + ", which is none");
    else if (PackDate(date) > PackDate(Today()))
        Add(Kind::Problem, number, "Date is " + text + ", which lies ahead");
}

std::string FolderCheck::Mend(DATABASE& portfolios, DATABASE& investments) {
    if (lost_.empty() && wrongValues_.empty())
        return {};
    if (std::string wrong = folder_.KeepBackup(); !wrong.empty())
        return wrong;
    for (const WrongValue& each : wrongValues_) {
        INVESTMENT_DATA record;
        bool written = ReadInvestment(investments, each.record, &record);
        record.Value = record.Shares * record.Price;
        written = written && investments.Write(each.record, &record) == 0;
        if (!written)
            return "record " + std::to_string(each.record) + " of " + folder_.PathOf(InvestmentFile) +
                   " cannot be written: " + ErrorMessage(investments.GetLastError(nullptr));
        findings_[each.finding].kind = Kind::Mended;
    }
    const std::vector<std::string> restored = RestorePortfolios(portfolios, investments);
    for (const Lost& each : lost_)
        if (std::find(restored.begin(), restored.end(), each.portfolio) != restored.end())
            findings_[each.finding].kind = Kind::Mended;
    return portfolios.Sync() == 0 && investments.Sync() == 0 ? "" : "what was mended is not on the disk yet";
}
