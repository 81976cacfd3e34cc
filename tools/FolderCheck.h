#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "app/model/RecordLayouts.h"
#include "tools/ToolFolder.h"

struct FolderFinding {
    enum class Kind { Problem, Mended, Remark };
    Kind kind = Kind::Problem;
    std::string file;         // its name in the folder
    std::int64_t offset = -1; // of the first byte concerned; -1 for none
    std::int64_t record = -1; // the record concerned; -1 for none
    std::string text;         // one sentence without its full stop
};

// Checks a folder as a whole: each data file by FileCheck, and what one file cannot know or its bytes do not
// tell: investments of no portfolio, a Value that is not Shares times Price, a Risk that no chart counts, a
// Date that is none or lies ahead. What can be set right without a guess it mends when it is asked to: the
// counts of a file, Value, and portfolios that are not listed.
//
// A command owns it, for one run.
class FolderCheck {
  public:
    // Both must outlive the object.
    explicit FolderCheck(ToolFolder& folder, FileOperations& operations = SystemFiles())
        : folder_(folder), operations_(operations) {}

    // Looks at everything. With `repair`, for which the folder must be locked, it mends after the day's
    // backup. Returns an empty text, or what hindered it: then not all was looked at or mended.
    [[nodiscard]] std::string Run(bool repair);

    [[nodiscard]] const std::vector<FolderFinding>& Findings() const { return findings_; }
    // Whether nothing is wrong, or nothing any more.
    [[nodiscard]] bool IsSound() const;

  private:
    [[nodiscard]] std::string CheckFile(const DataFileKind& kind, bool repair,
                                        std::unique_ptr<DATABASE>* opened);
    void CheckInvestment(const INVESTMENT_DATA& record, long number);
    void JudgeDate(const dbDATE& date, long number);
    [[nodiscard]] std::string CheckTogether(DATABASE& portfolios, DATABASE& investments);
    [[nodiscard]] std::string Mend(DATABASE& portfolios, DATABASE& investments);
    void Add(FolderFinding::Kind kind, long number, const std::string& text) {
        findings_.push_back({kind, InvestmentFile.name, -1, number, text});
    }

    ToolFolder& folder_;
    FileOperations& operations_;
    std::vector<FolderFinding> findings_;
    // What Mend sets right, and the places of its findings.
    struct Lost {
        std::string portfolio;
        std::size_t finding;
    };
    struct WrongValue {
        long record;
        std::size_t finding;
    };
    std::vector<Lost> lost_;
    std::vector<WrongValue> wrongValues_;
};
