#include "app/model/DataFileOpening.h"

#include <cerrno>
#include <fcntl.h>

#include "db/Database.h"
#include "util/Strings.h"

namespace {

std::string WhyNotOpened(const std::string& folder, const std::string& name, FileOperations& operations) {
    const std::string path = folder + "/" + name;
    File file(operations);
    const int error = file.Open(path, FileMode::ReadOnly);
    if (const std::string leftover = FindCompactionLeftover(path); error == ENOENT && !leftover.empty())
        return name + " is missing, but " + leftover +
               " is there, as an interrupted compaction leaves it. \"quorvan-cli db " + path +
               " check --repair\" gives it the file's name.";
    if (error == ENOENT)
        return name + " is missing. \"quorvan-cli setup " + folder + "\" makes a new one.";
    if (error != 0)
        return name + " cannot be opened: " + (error == EINVAL ? "it is no file" : Reason(error)) + ".";
    return name + " is no data file, or its beginning is damaged. It is left as it is.";
}

std::string WhyNotWritten(const std::string& path, FileOperations& operations) {
    File file(operations);
    const int error = file.Open(path, FileMode::ReadWrite);
    return error == 0 ? std::string() : ": " + Reason(error);
}

int Refuse() {
    errno = EROFS;
    return -1;
}

} // namespace

int ReadOnlyFiles::Open(const char* path, int flags, mode_t mode) {
    return (flags & O_ACCMODE) == O_RDONLY ? FileOperations::Open(path, flags, mode) : Refuse();
}

int ReadOnlyFiles::Rename(const char* /*from*/, const char* /*to*/) {
    return Refuse();
}

int ReadOnlyFiles::Remove(const char* /*path*/) {
    return Refuse();
}

std::unique_ptr<DATABASE> OpenDataFile(const std::string& folder, const std::string& name,
                                       bool (*holds)(DATABASE&), DataFileUse use, FileOperations& operations,
                                       std::string& complaints) {
    const auto complain = [&](const std::string& sentence) { complaints += sentence + "\n"; };
    const std::string path = folder + "/" + name;
    RestoreCompactionBackup(path.c_str(), operations); // where it fails, the file is missing
    auto database = std::make_unique<DATABASE>(path.c_str(), operations);
    if (!database->IsOpen()) {
        complain(WhyNotOpened(folder, name, operations));
    } else if (!holds(*database)) {
        complain(name + " holds other records than Quorvan's. It is left as it is.");
    } else {
        if (database->IsDamaged())
            complain(name + " is damaged: what can be read of it is shown. \"quorvan-cli db " + path +
                     " check\" tells what is wrong.");
        if (use == DataFileUse::Change && database->IsReadOnly())
            complain(name + " cannot be written" + WhyNotWritten(path, operations) +
                     ". What you change in it will not be kept.");
        return database;
    }
    return std::make_unique<DATABASE>(nullptr, operations);
}
