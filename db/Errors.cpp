#include "db/Errors.h"

#include <algorithm>
#include <iterator>
#include <string_view>

namespace {

struct Entry {
    int code;
    std::string_view message;
};

constexpr int Terminator = 65535; // -1 as a 16-bit value

constexpr Entry ErrorMessages[] = {
    {0, "No error"},
    {1001, "QueryReset - out of memory"},
    {1002, "QueryReset - out of memory"},
    {1101, "Invalid column name"},
    {1102, "Create error - file already exists"},
    {1103, "Open error - file could not be opened"},
    {1104, "Create error - out of memory"},
    {1105, "Open error - out of memory"},
    {1106, "Create error - out of memory"},
    {1107, "Open error - out of memory"},
    {1108, "Open error - out of memory"},
    {1109, "Create error - file could not be created"},
    {1110, "Create error - invalid columns"},
    {1201, "Read error - ivalid record number"},
    {1202, "Read error - record is deleted"},
    {1209, "Read error - unable to read record"},
    {1302, "Write error - invalid record number"},
    {1303, "Write error - record is deleted"},
    {1309, "Write error - unable to write record"},
    {1402, "Delete error - invalid record number"},
    {1403, "Delete error - record is already deleted"},
    {1409, "Delete error - unable to write record"},
    {1502, "Undelete error - invalid record number"},
    {1503, "Undelete error - record is not deleted"},
    {1509, "Undelete error - unable to write record"},
    {1601, "Query error - can't query after SORT"},
    {1602, "Query error - invalid column name"},
    {1603, "Query error - invalid operator"},
    {1604, "Query error - out of memory"},
    {1605, "Query error - out of memory"},
    {1606, "Query error - CONTAINS is only valid for STRINGS"},
    {1607, "Query error - A NEW query must precede an OR or AND query"},
    {1608, "Query error - Invalid statement"},
    {1609, "Query error - unable to read records"},
    {1701, "Sort error - invalid column name"},
    {1702, "Sort error - out of memory"},
    {1703, "Sort error - out of memory"},
    {1704, "Sort error - out of memory"},
    {1709, "Sort error - unable to read records"},
    {1801, "Load error - unable to open file"},
    {1802, "Load error - invalid input data format"},
    {1803, "Load error - out of memory"},
    {1804, "Load error - out of memory"},
    {1808, "Load error - no file is open"},
    {1809, "Load error - unable to read file"},
    {1901, "Export error - unable to open output file"},
    {1902, "Export error - out of memory"},
    {1903, "Export error - out of memory"},
    {1907, "Export error - unable to read records"},
    {1908, "Export error - no file is open"},
    {1909, "Export error - unable to write output file"},
    {2101, "Update error - no record to update"},
    {2201, "QueryUpdate error - invalid set statement"},
    {2202, "QueryUpdate error - invalid column name"},
    {2203, "QueryUpdate error - can only SET strings"},
    {2204, "QueryUpdate error - out of memory"},
    {2205, "QueryUpdate error - invalid statement"},
    {2206, "QueryUpdate error - unable to read records"},
    {2301, "Lock error - record is deleted"},
    {2302, "Lock error - invalid record number"},
    {2303, "Lock error - record is already locked"},
    {2309, "Lock error - unable to write record"},
    {2401, "UnLock error - record is deleted"},
    {2402, "UnLock error - invalid record number"},
    {2403, "UnLock error - record isn't already locked"},
    {2409, "UnLock error - unable to write record"},
    {2501, "IsLocked error - record is deleted"},
    {2502, "IsLocked error - invalid record number"},
    {2509, "IsLocked error - unable to read record"},
    {2601, "SetReadCache error - out of memory"},
    {2701, "Compress error - out of memory"},
    {2702, "Compress error - unable to rename"},
    {2703, "Compress error - unable to rename"},
    {2704, "Compress error - unable to delete temp db"},
    {2705, "Compress error - unable to open temp file"},
    {2706, "Compress error - unable to write temp file"},
    {2707, "Compress error - unable to read records"},
    {2708, "Compress error - file and header disagree"},
    {2709, "Compress error - no file is open"},
    {2801, "Append error - unable to write record"},
    {2802, "Append error - no file is open"},
    {2803, "Append error - file holds more than its header says"},
    {2804, "Append error - too many records"},
    {2901, "Header error - unable to write header"},
    {3001, "Sync error - unable to reach the disk"},
    {Terminator, "Unknown error"},
};

static_assert(std::ranges::all_of(ErrorMessages,
                                  [](const Entry& entry) { return entry.message.size() < ErrorMessageSize; }),
              "callers' buffers hold the longest message");

} // namespace

const char* ErrorMessage(int code) {
    const auto* last = std::prev(std::end(ErrorMessages));
    const auto* entry =
        std::find_if(std::begin(ErrorMessages), last, [code](const Entry& e) { return e.code == code; });
    return entry->message.data();
}
