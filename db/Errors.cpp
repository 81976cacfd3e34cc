#include "db/Errors.h"

// Callers' buffers hold the longest message.
#define DATABASE_ERROR_FITS(name, code, message) static_assert(sizeof(message) <= ErrorMessageSize);
DATABASE_ERRORS(DATABASE_ERROR_FITS)

const char* ErrorMessage(int code) {
    switch (code) {
#define DATABASE_ERROR_MESSAGE(name, code, message)                                                          \
    case code:                                                                                               \
        return message;
        DATABASE_ERRORS(DATABASE_ERROR_MESSAGE)
    default:
        return "Unknown error";
    }
}
