#pragma once

/// Codes of the record database. The hundreds name the operation, the last two digits what was in its way;
/// Errors.cpp has a sentence for each.
namespace DatabaseError {
enum Code : int {
    None = 0,

    ResetNoMemoryForSlots = 1001,
    ResetNoMemoryForRecord = 1002,

    InvalidColumnIndex = 1101,
    CreateFileExists = 1102,
    OpenFailed = 1103,
    CreateNoMemoryForColumns = 1104,
    OpenNoMemoryForColumns = 1105,
    CreateNoMemoryForRecord = 1106,
    OpenNoMemoryForRecord = 1107,
    OpenNoMemoryForScratch = 1108,
    CreateFailed = 1109,
    CreateInvalidColumns = 1110,

    ReadInvalidRecord = 1201,
    ReadDeleted = 1202,
    ReadFailed = 1209,

    WriteInvalidRecord = 1302,
    WriteDeleted = 1303,
    WriteFailed = 1309,

    DeleteInvalidRecord = 1402,
    DeleteDeleted = 1403,
    DeleteFailed = 1409,

    UnDeleteInvalidRecord = 1502,
    UnDeleteNotDeleted = 1503,
    UnDeleteFailed = 1509,

    QueryAfterSort = 1601,
    QueryInvalidColumn = 1602,
    QueryInvalidOperator = 1603,
    QueryNoMemoryForRecord = 1604,
    QueryNoMemoryForSlots = 1605,
    QueryContainsNeedsString = 1606,
    QueryNoSet = 1607,
    QueryInvalidStatement = 1608,
    QueryFailed = 1609,

    SortInvalidColumn = 1701,
    SortNoMemoryForFirstRecord = 1702,
    SortNoMemoryForSecondRecord = 1703,
    SortNoMemoryForKeys = 1704,
    SortReadFailed = 1709,

    LoadOpenFailed = 1801,
    LoadInvalidFormat = 1802,
    LoadNoMemoryForLine = 1803,
    LoadNoMemoryForRecord = 1804,
    LoadNoFile = 1808,
    LoadReadFailed = 1809,

    ExportOpenFailed = 1901,
    ExportNoMemoryForLine = 1902,
    ExportNoMemoryForRecord = 1903,
    ExportReadFailed = 1907,
    ExportNoFile = 1908,
    ExportWriteFailed = 1909,

    UpdateNoRecord = 2101,

    SetInvalidOperator = 2201,
    SetInvalidColumn = 2202,
    SetStringsOnly = 2203,
    SetNoMemory = 2204,
    SetInvalidStatement = 2205,
    SetReadFailed = 2206,

    LockDeleted = 2301,
    LockInvalidRecord = 2302,
    LockLocked = 2303,
    LockFailed = 2309,

    UnLockDeleted = 2401,
    UnLockInvalidRecord = 2402,
    UnLockNotLocked = 2403,
    UnLockFailed = 2409,

    IsLockedDeleted = 2501,
    IsLockedInvalidRecord = 2502,
    IsLockedFailed = 2509,

    CacheNoMemory = 2601,

    CompressNoMemory = 2701,
    CompressFirstRename = 2702,
    CompressSecondRename = 2703,
    CompressRemoveBackup = 2704,
    CompressOpenTemporary = 2705,
    CompressWriteFailed = 2706,
    CompressReadFailed = 2707,
    CompressDamaged = 2708,
    CompressNoFile = 2709,

    AppendFailed = 2801,
    AppendNoFile = 2802,
    AppendDamaged = 2803,
    AppendFull = 2804,

    HeaderFailed = 2901,

    SyncFailed = 3001,
};
} // namespace DatabaseError

/// Room for the longest message and its terminator.
inline constexpr int ErrorMessageSize = 58;

/// The message of an error code: "No error" for 0, "Unknown error" for a code that the engine does not have.
/// The text is constant and lives as long as the program.
const char* ErrorMessage(int code);
