#pragma once

#include <cstdint>

#include "db/RecordTypes.h"

// Rules of the engine's dates and times; DATABASE offers them to its users. Nothing here touches a file.

// Room for the longest formatted date or time and its terminator.
inline constexpr int FormattedDateSize = 22;
inline constexpr int FormattedTimeSize = 15;

// Packed form: the little-endian number that the bytes in a record are.
[[nodiscard]] constexpr std::int32_t PackDate(const dbDATE& date) {
    return static_cast<std::int32_t>(static_cast<std::uint32_t>(static_cast<std::uint16_t>(date.year)) << 16 |
                                     static_cast<std::uint32_t>(static_cast<std::uint8_t>(date.month)) << 8 |
                                     static_cast<std::uint8_t>(date.day));
}
[[nodiscard]] constexpr dbDATE UnpackDate(std::int32_t packed) {
    return {static_cast<std::int8_t>(packed), static_cast<std::int8_t>(packed >> 8),
            static_cast<std::int16_t>(packed >> 16)};
}
// The packed form of a time has 24 bits.
[[nodiscard]] constexpr std::int32_t PackTime(const dbTIME& time) {
    return static_cast<std::uint8_t>(time.hour) << 16 | static_cast<std::uint8_t>(time.minute) << 8 |
           static_cast<std::uint8_t>(time.second);
}
[[nodiscard]] constexpr dbTIME UnpackTime(std::int32_t packed) {
    return {static_cast<std::int8_t>(packed), static_cast<std::int8_t>(packed >> 8),
            static_cast<std::int8_t>(packed >> 16)};
}

// Today's local date.
[[nodiscard]] dbDATE Today();

// Brings the month into 1 to 12, carrying into the year, then moves a day outside its month by one month. A
// day more than a month away stays outside.
void NormaliseDate(dbDATE* date);
// Carries seconds into minutes and minutes into hours, then moves an hour outside 0 to 23 by one day.
void NormaliseTime(dbTIME* time);
