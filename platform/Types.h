#pragma once

// Number types, status codes and colours that the whole platform layer shares.

#include <cstdint>

using uint8 = std::uint8_t;
using uint16 = std::uint16_t;
using int32 = std::int32_t;
using uint32 = std::uint32_t;
using int64 = std::int64_t;

// Microseconds.
using bigtime_t = std::int64_t;

// B_OK or more is success; every failure is negative.
using status_t = std::int32_t;

constexpr status_t B_OK = 0;
constexpr status_t B_ERROR = -1;
constexpr status_t B_NO_MEMORY = -2;
constexpr status_t B_BAD_VALUE = -3;
constexpr status_t B_TIMED_OUT = -4;
constexpr status_t B_INTERRUPTED = -5;
constexpr status_t B_WOULD_BLOCK = -6;
constexpr status_t B_BAD_SEM_ID = -7;
constexpr status_t B_BAD_THREAD_ID = -8;
constexpr status_t B_NAME_NOT_FOUND = -9;
constexpr status_t B_BAD_TYPE = -11;

// "Without limit", where a time-out is asked for.
constexpr bigtime_t B_INFINITE_TIMEOUT = INT64_MAX;

struct rgb_color {
    uint8 red = 0;
    uint8 green = 0;
    uint8 blue = 0;
    uint8 alpha = 255;

    bool operator==(const rgb_color&) const = default;
};

enum color_space { B_CMAP8 };

enum border_style { B_PLAIN_BORDER, B_FANCY_BORDER, B_NO_BORDER };
