#include "app/state/AppState.h"

#include "db/Database.h"

AppState* app_state = nullptr;

BBitmap* UpArrowBitmap = nullptr;
BBitmap* DownArrowBitmap = nullptr;
BBitmap* EqualsSignBitmap = nullptr;
BBitmap* QuestionMarkBitmap = nullptr;
BBitmap* ErrorSymbolBitmap = nullptr;

AppState::AppState() = default;
AppState::~AppState() = default;
