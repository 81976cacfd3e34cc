#include "db/FieldValue.h"

#include <charconv>
#include <cmath>
#include <cstdlib>

#include "db/DatesTimes.h"

namespace {

// At least `width` characters, a minus sign among them.
char* PutPadded(int value, int width, char* out) {
    if (value < 0) {
        *out++ = '-';
        --width;
    }
    char digits[LongField::LongestText];
    const char* end = PutWhole(std::abs(value), digits);
    out = std::fill_n(out, std::max<std::ptrdiff_t>(width - (end - digits), 0), '0');
    return std::copy<const char*>(digits, end, out);
}

} // namespace

char* PutWhole(std::int32_t value, char* out) {
    return std::to_chars(out, out + LongField::LongestText, value).ptr;
}

// What is no number has no sign either.
char* PutFloat(float value, int decimals, char* out) {
    value = std::isnan(value) ? std::numeric_limits<float>::quiet_NaN() : value;
    return std::to_chars(out, out + FloatField::LongestText, static_cast<double>(value),
                         std::chars_format::fixed, decimals)
        .ptr;
}

char* PutDate(std::int32_t packed, char* out) {
    const dbDATE date = UnpackDate(packed);
    return PutPadded(date.day, 2, PutPadded(date.month, 2, PutPadded(date.year, 4, out)));
}

char* PutTime(std::int32_t packed, char* out) {
    const dbTIME time = UnpackTime(packed);
    return PutPadded(time.second, 2, PutPadded(time.minute, 2, PutPadded(time.hour, 2, out)));
}
