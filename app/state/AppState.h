#pragma once

#include <cstdlib>
#include <memory>

#include "app/model/RecordLayouts.h"
#include "platform/Types.h"
#include "util/Strings.h"

class BBitmap;
class DATABASE;

struct FreeMemory {
    void operator()(void* memory) const { std::free(memory); }
};

// What every room may know of the running program: where its files lie, the three open databases, and the
// clipboard of investments. It knows no window and does nothing by itself. The application object owns the
// only one and lets app_state point at it for as long as it lives; it is used on the interface thread, save
// the paths, which never change, and the investment database, which the price update's worker has to itself
// while it runs.
struct AppState {
    AppState();
    ~AppState();
    AppState(const AppState&) = delete;
    AppState& operator=(const AppState&) = delete;

    // The folder that holds the program, without a trailing "/", and the files in it.
    char homeFolder[PathBufferSize] = "";
    char settingsPath[PathBufferSize] = "";
    char logPath[PathBufferSize] = "";
    char quoteSourcePath[PathBufferSize] = "";
    char helpPath[PathBufferSize] = "";

    // Never null while app_state is set. A database whose file could not be opened has no records and takes
    // none.
    std::unique_ptr<DATABASE> portfolios;
    std::unique_ptr<DATABASE> investments;
    std::unique_ptr<DATABASE> categories;

    // Whole records in the order in which they were copied; null and 0 when empty.
    std::unique_ptr<INVESTMENT_DATA[], FreeMemory> clipboard;
    int32 clipboardCount = 0;
    bool clipboardIsOnlyCopy = false; // cut, and not pasted since
};

// The main window's; the price update finds the window by it.
inline constexpr const char* WindowTitle = "Quorvan";

// Null when there is no application object.
extern AppState* app_state;

// The pictures that tell how an investment's price moved; owned by the application object, null without one.
extern BBitmap* UpArrowBitmap;
extern BBitmap* DownArrowBitmap;
extern BBitmap* EqualsSignBitmap;
extern BBitmap* QuestionMarkBitmap;
extern BBitmap* ErrorSymbolBitmap;
