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
    for (int i = 0; i < 4; ++i)
        code = code << 8 | static_cast<uint8>(letters[i]);
    return code;
}

// Message codes that the layer itself sends or answers.
constexpr uint32 B_QUIT_REQUESTED = message_code("_QRQ");
constexpr uint32 B_ABOUT_REQUESTED = message_code("_ABR");

// A message: a code and typed, named fields of one value each. A plain value:
// copying it copies its fields. It reaches a looper by PostMessage, which keeps a copy of its own.
//
// Every Find operation returns B_OK and stores the value, or leaves the caller's variable alone and returns
// B_NAME_NOT_FOUND (no such field) or B_BAD_TYPE (a value of another type).
class BMessage {
  public:
    BMessage() = default;
    explicit BMessage(uint32 code) : what(code) {}

    uint32 what = 0;

    void AddString(const char* name, const char* value) { Add(name, std::string(value)); }
    void AddInt32(const char* name, int32 value) { Add(name, value); }
    void AddFloat(const char* name, float value) { Add(name, value); }
    void AddBool(const char* name, bool value) { Add(name, value); }
    void AddPoint(const char* name, BPoint value) { Add(name, value); }

    // The text stays valid until the message is changed or destroyed.
    status_t FindString(const char* name, const char** value) const;
    status_t FindInt32(const char* name, int32* value) const;
    status_t FindFloat(const char* name, float* value) const;
    status_t FindBool(const char* name, bool* value) const;
    status_t FindPoint(const char* name, BPoint* value) const;

  private:
    using Value = std::variant<std::string, int32, float, bool, BPoint>;

    void Add(const char* name, Value value) { fields_.insert_or_assign(name, std::move(value)); }
    template <class T>
    status_t Find(const char* name, const T** value) const;
    template <class T>
    status_t FindValue(const char* name, T* value) const;

    std::map<std::string, Value, std::less<>> fields_;
};
