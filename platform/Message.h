#pragma once

#include <map>
#include <string>
#include <variant>
#include <vector>

#include "platform/Rect.h"
#include "platform/Types.h"

// A message code written as four letters, first letter in the highest byte.
constexpr uint32 message_code(const char (&letters)[5]) {
    uint32 code = 0;
    for (int i = 0; i < 4; i++)
        code = code << 8 | static_cast<uint8>(letters[i]);
    return code;
}

// Message codes that the layer itself sends or answers.
constexpr uint32 B_QUIT_REQUESTED = message_code("_QRQ");
constexpr uint32 B_ABOUT_REQUESTED = message_code("_ABR");

// A message: a code and typed, named fields, each of which may hold several values in order. A plain value:
// copying it copies its fields. It reaches a looper by PostMessage, which keeps a copy of its own.
//
// Every Find operation returns B_OK and stores the value, or leaves the caller's variable alone and returns
// B_NAME_NOT_FOUND (no such field), B_BAD_INDEX (fewer values) or B_BAD_TYPE (values of another type).
class BMessage {
  public:
    BMessage() = default;
    explicit BMessage(uint32 code) : what(code) {}

    uint32 what = 0;

    status_t AddString(const char* name, const char* value) { return Add(name, std::string(value)); }
    status_t AddInt32(const char* name, int32 value) { return Add(name, value); }
    status_t AddFloat(const char* name, float value) { return Add(name, value); }
    status_t AddBool(const char* name, bool value) { return Add(name, value); }
    status_t AddPoint(const char* name, BPoint value) { return Add(name, value); }

    // The text stays valid until the message is changed or destroyed.
    status_t FindString(const char* name, const char** value, int32 index = 0) const;
    status_t FindInt32(const char* name, int32* value, int32 index = 0) const;
    status_t FindFloat(const char* name, float* value, int32 index = 0) const;
    status_t FindBool(const char* name, bool* value, int32 index = 0) const;
    status_t FindPoint(const char* name, BPoint* value, int32 index = 0) const;

  private:
    using Value = std::variant<std::string, int32, float, bool, BPoint>;

    status_t Add(const char* name, Value value);
    template <class T>
    status_t Find(const char* name, int32 index, const T** value) const;
    template <class T>
    status_t FindValue(const char* name, int32 index, T* value) const;

    std::map<std::string, std::vector<Value>, std::less<>> fields_;
};
