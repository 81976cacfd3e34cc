#include <limits>

#include "db/Database.h"

namespace {

// A position outside the numbers' range stays at its end: still outside the set.
long Moved(long position, long step) {
    long moved = 0;
    if (!__builtin_add_overflow(position, step, &moved))
        return moved;
    return step < 0 ? std::numeric_limits<long>::min() : std::numeric_limits<long>::max();
}

} // namespace

void* DATABASE::QueryGetFirst(long* record) {
    return QueryGetXXX(0, 1, record);
}

void* DATABASE::QueryGetNext(long* record) {
    return QueryGetXXX(-1, 1, record);
}

void* DATABASE::QueryGetLast(long* record) {
    return QueryGetXXX(static_cast<long>(header_.recordCount) - 1, -1, record);
}

void* DATABASE::QueryGetPrev(long* record) {
    return QueryGetXXX(-1, -1, record);
}

void* DATABASE::QueryGetXXX(long start, long step, long* record) {
    if (!slots_ && QueryReset() < 0)
        return nullptr;
    bool found = false;
    if (const int code = MoveWalk(start, step, &found); code != DatabaseError::None)
        lastError_ = code;
    if (found && record != nullptr)
        *record = slots_[walkPosition_];
    return found ? recordBuffer_.get() : nullptr;
}

// Reads the next record of the walk into the record buffer; there must be a result set. Returns an error
// code; neither that nor a record at the walk's end.
int DATABASE::MoveWalk(long start, long step, bool* found) {
    *found = false;
    if (resultCount_ == 0)
        return DatabaseError::None;
    // Records appended since the query have no slot: a walk may begin or stand among them, but finds none
    // there.
    const auto inFile = [this](long position) { return position >= 0 && position < header_.recordCount; };
    walkPosition_ = start >= 0 ? start : Moved(walkPosition_, step);
    while (inFile(walkPosition_)) {
        const std::int32_t number = walkPosition_ < slotCount_ ? slots_[walkPosition_] : NotInSet;
        if (number != NotInSet) {
            const int code = FetchRecord(number, recordBuffer_.get(), cache_.HasBuffer());
            *found = code == DatabaseError::None;
            if (*found || code == DatabaseError::ReadFailed)
                return code;
            slots_[walkPosition_] = NotInSet; // deleted since the query
            --resultCount_;
        }
        if (step == 0)
            break;
        walkPosition_ = Moved(walkPosition_, step);
    }
    return DatabaseError::None;
}

long DATABASE::ConvertPhysToLogRecordNumber(long n) const {
    long before = 0;
    for (std::int32_t i = 0; i < slotCount_; ++i) {
        if (slots_[i] == n && n >= 0)
            return before;
        before += slots_[i] != NotInSet ? 1 : 0;
    }
    return -1;
}
