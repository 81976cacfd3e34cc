#pragma once

#include <string>

#include "db/Database.h"
#include "tools/ToolFolder.h"

// A copy of a data file beside it, NAME.part, which is changed in the file's stead and then takes its place
// by a rename, with its owner and permissions: whoever looks, and a kill at any moment, finds the old file or
// the new one. Of a symbolic link it is the file that it leads to. What a kill leaves of a copy is
// overwritten by the next one.
//
// Each operation returns an empty text, or in a sentence what hinders it; then the data file is what it was.
// Who holds the folder's lock owns it, and calls the operations in their order.
class DataFileCopy {
  public:
    // `operations` must outlive the object.
    DataFileCopy(const ToolFolder& folder, const DataFileKind& file, FileOperations& operations);
    DataFileCopy(const DataFileCopy&) = delete;
    DataFileCopy& operator=(const DataFileCopy&) = delete;
    // Removes a copy that has not taken the file's place.
    ~DataFileCopy();

    // Makes the copy and opens it: one of the file, or of another, `from`, that is to take its place.
    [[nodiscard]] std::string Make() { return Make(path_); }
    [[nodiscard]] std::string Make(const std::string& from);
    // To be changed between the two.
    [[nodiscard]] DATABASE& Data() { return data_; }
    // Brings it to the disk and checks it.
    [[nodiscard]] std::string Finish();
    // When only the new name could not be brought to the disk, the file is the new one all the same, and
    // `unsure` gets a sentence about that.
    [[nodiscard]] std::string TakePlace(std::string* unsure);

  private:
    std::string path_;
    std::string copy_;
    FileOperations& operations_;
    DATABASE data_;
    bool made_ = false;
};
