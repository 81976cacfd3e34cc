#include "platform/Message.h"

template <class T>
status_t BMessage::Find(const char* name, const T** value) const {
    const auto field = fields_.find(name);
    if (field == fields_.end())
        return B_NAME_NOT_FOUND;
    const T* found = std::get_if<T>(&field->second);
    if (!found)
        return B_BAD_TYPE;
    *value = found;
    return B_OK;
}

template <class T>
status_t BMessage::FindValue(const char* name, T* value) const {
    const T* found = nullptr;
    const status_t status = Find(name, &found);
    if (status == B_OK)
        *value = *found;
    return status;
}

status_t BMessage::FindString(const char* name, const char** value) const {
    const std::string* found = nullptr;
    const status_t status = Find(name, &found);
    if (status == B_OK)
        *value = found->c_str();
    return status;
}

status_t BMessage::FindInt32(const char* name, int32* value) const {
    return FindValue(name, value);
}

status_t BMessage::FindFloat(const char* name, float* value) const {
    return FindValue(name, value);
}

status_t BMessage::FindBool(const char* name, bool* value) const {
    return FindValue(name, value);
}

status_t BMessage::FindPoint(const char* name, BPoint* value) const {
    return FindValue(name, value);
}
