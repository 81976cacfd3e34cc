#pragma once

// The error codes of the record database: name, number and message. The hundreds name the operation, the last
// two digits what was in its way.
// clang-format off
#define DATABASE_ERRORS(E) \
    E(None, 0, "No error") \
    E(ResetNoMemoryForSlots, 1001, "QueryReset - out of memory") \
    E(ResetNoMemoryForRecord, 1002, "QueryReset - out of memory") \
    E(InvalidColumnIndex, 1101, "Invalid column name") \
    E(CreateFileExists, 1102, "Create error - file already exists") \
    E(OpenFailed, 1103, "Open error - file could not be opened") \
    E(CreateNoMemoryForColumns, 1104, "Create error - out of memory") \
    E(OpenNoMemoryForColumns, 1105, "Open error - out of memory") \
    E(CreateNoMemoryForRecord, 1106, "Create error - out of memory") \
    E(OpenNoMemoryForRecord, 1107, "Open error - out of memory") \
    E(OpenNoMemoryForScratch, 1108, "Open error - out of memory") \
    E(CreateFailed, 1109, "Create error - file could not be created") \
    E(CreateInvalidColumns, 1110, "Create error - invalid columns") \
    E(ReadInvalidRecord, 1201, "Read error - ivalid record number") \
    E(ReadDeleted, 1202, "Read error - record is deleted") \
    E(ReadFailed, 1209, "Read error - unable to read record") \
    E(WriteInvalidRecord, 1302, "Write error - invalid record number") \
    E(WriteDeleted, 1303, "Write error - record is deleted") \
    E(WriteFailed, 1309, "Write error - unable to write record") \
    E(DeleteInvalidRecord, 1402, "Delete error - invalid record number") \
    E(DeleteDeleted, 1403, "Delete error - record is already deleted") \
    E(DeleteFailed, 1409, "Delete error - unable to write record") \
    E(UnDeleteInvalidRecord, 1502, "Undelete error - invalid record number") \
    E(UnDeleteNotDeleted, 1503, "Undelete error - record is not deleted") \
    E(UnDeleteFailed, 1509, "Undelete error - unable to write record") \
    E(QueryAfterSort, 1601, "Query error - can't query after SORT") \
    E(QueryInvalidColumn, 1602, "Query error - invalid column name") \
    E(QueryInvalidOperator, 1603, "Query error - invalid operator") \
    E(QueryNoMemoryForRecord, 1604, "Query error - out of memory") \
    E(QueryNoMemoryForSlots, 1605, "Query error - out of memory") \
    E(QueryContainsNeedsString, 1606, "Query error - CONTAINS is only valid for STRINGS") \
    E(QueryNoSet, 1607, "Query error - A NEW query must precede an OR or AND query") \
    E(QueryInvalidStatement, 1608, "Query error - Invalid statement") \
    E(QueryFailed, 1609, "Query error - unable to read records") \
    E(SortInvalidColumn, 1701, "Sort error - invalid column name") \
    E(SortNoMemoryForFirstRecord, 1702, "Sort error - out of memory") \
    E(SortNoMemoryForSecondRecord, 1703, "Sort error - out of memory") \
    E(SortNoMemoryForKeys, 1704, "Sort error - out of memory") \
    E(SortReadFailed, 1709, "Sort error - unable to read records") \
    E(LoadOpenFailed, 1801, "Load error - unable to open file") \
    E(LoadInvalidFormat, 1802, "Load error - invalid input data format") \
    E(LoadNoMemoryForLine, 1803, "Load error - out of memory") \
    E(LoadNoMemoryForRecord, 1804, "Load error - out of memory") \
    E(LoadNoFile, 1808, "Load error - no file is open") \
    E(LoadReadFailed, 1809, "Load error - unable to read file") \
    E(ExportOpenFailed, 1901, "Export error - unable to open output file") \
    E(ExportNoMemoryForLine, 1902, "Export error - out of memory") \
    E(ExportNoMemoryForRecord, 1903, "Export error - out of memory") \
    E(ExportReadFailed, 1907, "Export error - unable to read records") \
    E(ExportNoFile, 1908, "Export error - no file is open") \
    E(ExportWriteFailed, 1909, "Export error - unable to write output file") \
    E(UpdateNoRecord, 2101, "Update error - no record to update") \
    E(SetInvalidOperator, 2201, "QueryUpdate error - invalid set statement") \
    E(SetInvalidColumn, 2202, "QueryUpdate error - invalid column name") \
    E(SetStringsOnly, 2203, "QueryUpdate error - can only SET strings") \
    E(SetNoMemory, 2204, "QueryUpdate error - out of memory") \
    E(SetInvalidStatement, 2205, "QueryUpdate error - invalid statement") \
    E(SetReadFailed, 2206, "QueryUpdate error - unable to read records") \
    E(LockDeleted, 2301, "Lock error - record is deleted") \
    E(LockInvalidRecord, 2302, "Lock error - invalid record number") \
    E(LockLocked, 2303, "Lock error - record is already locked") \
    E(LockFailed, 2309, "Lock error - unable to write record") \
    E(UnLockDeleted, 2401, "UnLock error - record is deleted") \
    E(UnLockInvalidRecord, 2402, "UnLock error - invalid record number") \
    E(UnLockNotLocked, 2403, "UnLock error - record isn't already locked") \
    E(UnLockFailed, 2409, "UnLock error - unable to write record") \
    E(IsLockedDeleted, 2501, "IsLocked error - record is deleted") \
    E(IsLockedInvalidRecord, 2502, "IsLocked error - invalid record number") \
    E(IsLockedFailed, 2509, "IsLocked error - unable to read record") \
    E(CacheNoMemory, 2601, "SetReadCache error - out of memory") \
    E(CompressNoMemory, 2701, "Compress error - out of memory") \
    E(CompressFirstRename, 2702, "Compress error - unable to rename") \
    E(CompressSecondRename, 2703, "Compress error - unable to rename") \
    E(CompressRemoveBackup, 2704, "Compress error - unable to delete temp db") \
    E(CompressOpenTemporary, 2705, "Compress error - unable to open temp file") \
    E(CompressWriteFailed, 2706, "Compress error - unable to write temp file") \
    E(CompressReadFailed, 2707, "Compress error - unable to read records") \
    E(CompressDamaged, 2708, "Compress error - file and header disagree") \
    E(CompressNoFile, 2709, "Compress error - no file is open") \
    E(AppendFailed, 2801, "Append error - unable to write record") \
    E(AppendNoFile, 2802, "Append error - no file is open") \
    E(AppendDamaged, 2803, "Append error - file holds more than its header says") \
    E(AppendFull, 2804, "Append error - too many records") \
    E(HeaderFailed, 2901, "Header error - unable to write header") \
    E(SyncFailed, 3001, "Sync error - unable to reach the disk")
// clang-format on

namespace DatabaseError {
#define DATABASE_ERROR_CODE(name, code, message) name = (code),
enum Code : int { DATABASE_ERRORS(DATABASE_ERROR_CODE) };
#undef DATABASE_ERROR_CODE
} // namespace DatabaseError

// Room for the longest message and its terminator.
inline constexpr int ErrorMessageSize = 58;

// The message of an error code: "No error" for 0, "Unknown error" for a code that the engine does not have.
// The text is constant and lives as long as the program.
const char* ErrorMessage(int code);
