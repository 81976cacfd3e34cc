#include "platform/Message.h"

status_t BMessage::Add(const char* name, Value value) {
    std::vector<Value>& values = fields_[name];
    if (!values.empty() && values.front().index() != value.index())
        return B_BAD_TYPE;
    values.push_back(std::move(value));
    return B_OK;
}

template <class T>
status_t BMessage::Find(const char* name, int32 index, const T** value) const {
    const auto field = fields_.find(name);
    if (field == fields_.end())
        return B_NAME_NOT_FOUND;
    if (index < 0 || static_cast<std::size_t>(index) >= field->second.size())
        return B_BAD_INDEX;
    const T* found = std::get_if<T>(&field->second[static_cast<std::size_t>(index)]);
    if (!found)
        return B_BAD_TYPE;
    *value = found;
    return B_OK;
}

template <class T>
status_t BMessage::FindValue(const char* name, int32 index, T* value) const {
    const T* found = nullptr;
    const status_t status = Find(name, index, &found);
    if (status == B_OK)
        *value = *found;
    return status;
}

status_t BMessage::FindString(const char* name, const char** value, int32 index) const {
    const std::string* found = nullptr;
    const status_t status = Find(name, index, &found);
    if (status == B_OK)
        *value = found->c_str();
    return status;
}

status_t BMessage::FindInt32(const char* name, int32* value, int32 index) const {
    return FindValue(name, index, value);
}

status_t BMessage::FindFloat(const char* name, float* value, int32 index) const {
    return FindValue(name, index, value);
}

status_t BMessage::FindBool(const char* name, bool* value, int32 index) const {
    return FindValue(name, index, value);
}

status_t BMessage::FindPoint(const char* name, BPoint* value, int32 index) const {
    return FindValue(name, index, value);
}
