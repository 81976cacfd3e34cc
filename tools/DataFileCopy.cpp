#include "tools/DataFileCopy.h"

#include "app/model/DataFolders.h"
#include "db/FileCheck.h"
#include "util/Strings.h"

DataFileCopy::DataFileCopy(const ToolFolder& folder, const DataFileKind& file, FileOperations& operations)
    : path_(RealPath(folder.PathOf(file))),
      copy_(path_ + ".part"),
      operations_(operations),
      data_(nullptr, operations) {}

DataFileCopy::~DataFileCopy() {
    if (made_)
        static_cast<void>(RemoveFile(operations_, copy_));
}

std::string DataFileCopy::Make(const std::string& from) {
    static_cast<void>(RemoveFile(operations_, copy_)); // left by a program that was killed
    File source(operations_);
    File target(operations_);
    File present(operations_);
    int error = source.Open(from, FileMode::ReadOnly);
    error = error != 0 ? error : target.Open(copy_, FileMode::CreateNew);
    made_ = target.IsOpen();
    error = error != 0 ? error : target.CopyFrom(source);
    if (error == 0 && present.Open(path_, FileMode::ReadOnly) == 0)
        error = target.TakeOwnerAndMode(present);
    if (error != 0)
        return copy_ + " cannot be made: " + Reason(error);
    return data_.Open(copy_.c_str()) == 0 ? "" : copy_ + " cannot be opened: " + WhyNotOpened(copy_);
}

std::string DataFileCopy::Finish() {
    FileCheck check(operations_);
    if (data_.Sync() != 0)
        return copy_ + " cannot be brought to the disk: " + ErrorMessage(data_.GetLastError(nullptr));
    if (const int error = check.Run(copy_); error != 0)
        return copy_ + " cannot be read back: " + Reason(error);
    if (!check.IsSound())
        return copy_ + " cannot be read back as it was written: " + check.Findings().front().text;
    return {};
}

std::string DataFileCopy::TakePlace(std::string* unsure) {
    if (const int error = RenameFile(operations_, copy_, path_); error != 0)
        return path_ + " cannot be replaced: " + Reason(error);
    made_ = false;
    if (const int error = SyncFolderOf(operations_, path_); error != 0)
        *unsure = path_ + " is changed, but that may not outlast a power cut: " + Reason(error);
    return {};
}
