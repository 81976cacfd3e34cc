#pragma once

#include <memory>
#include <string>

#include "db/Database.h"

// How the program opens a data file at start: what it found is said in words that a person understands.

enum class DataFileUse { Change, Look };

// Opens the data file `name` in the folder for a DATABASE that holds(), and appends to `complaints`, each
// with its newline, a sentence about everything that a person should know: that the file is missing, cannot
// be opened, is no such data file, is damaged, or, with DataFileUse::Change, cannot be written. What an
// interrupted compaction has left is put right first. The result is never null; without a usable file it is a
// DATABASE that has none. `operations` must outlive it.
[[nodiscard]] std::unique_ptr<DATABASE> OpenDataFile(const std::string& folder, const std::string& name,
                                                     bool (*holds)(DATABASE&), DataFileUse use,
                                                     FileOperations& operations, std::string& complaints);
