#pragma once

#include <span>
#include <string>

#include "app/model/RecordLayouts.h"
#include "util/File.h"

class DATABASE;

// What was cut from a portfolio and has not been pasted yet, on disk: what a program that is killed meanwhile
// would take with it otherwise. The clipboard itself lives in memory. The file, cut.db in the program's
// folder, is a data file like the others and only there meanwhile; the object holds its name and nothing
// open. Used on the interface thread, which makes one where it needs one.
class CutFile {
  public:
    // `operations` must outlive the object.
    explicit CutFile(const std::string& folder, FileOperations& operations = SystemFiles())
        : path_(folder + "/cut.db"), operations_(operations) {}

    // Keeps copies of investments together with their record numbers, on the disk when it returns; to be
    // called before they are deleted. False, with nothing changed, when they cannot be written, or when
    // something is kept already.
    [[nodiscard]] bool Keep(std::span<const INVESTMENT_DATA> investments,
                            std::span<const long> numbers) const;
    // To be called once the investments are on the disk elsewhere, or given up.
    void Forget() const;

    enum class Outcome { NothingKept, Restored, Failed };
    // Adds what is kept to the investment file, each to its own portfolio, save what had not been deleted
    // there yet, and forgets it. When it fails all stays kept.
    [[nodiscard]] Outcome Restore(DATABASE& investments) const;

  private:
    std::string path_;
    FileOperations& operations_;
};
