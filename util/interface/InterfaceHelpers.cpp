#include "util/interface/InterfaceHelpers.h"

#include <algorithm>
#include <cmath>
#include <cstring>

#include "platform/Application.h"
#include "platform/View.h"
#include "platform/Window.h"
#include "util/CharacterBuffer.h"
#include "util/FailureTexts.h"

namespace {

constexpr bigtime_t WindowLockPatience = 200000; // microseconds
// A text, and its width in the font that frames are laid out for.
constexpr const char* SampleText = "  Cancel  ";
constexpr float UsualSampleWidth = 56;
constexpr float SizeStep = 0.05F; // of a font

} // namespace

void MessageBox(const char* text, alert_type type) {
    (new BAlert("", text, "Ok", nullptr, nullptr, type))->Go();
}

bool YesNoBox(const char* text) {
    constexpr int32 no = 1;
    return (new BAlert("", text, "Yes", "No", nullptr, B_WARNING_ALERT))->Go() == no;
}

void TellNotSaved() {
    MessageBox(NotSavedText, B_STOP_ALERT);
}

void TellNotRead(const char* what) {
    MessageBox(NotReadText(what).c_str(), B_STOP_ALERT);
}

void TellNotConnected() {
    MessageBox(NotConnectedText, B_STOP_ALERT);
}

void TellNotTrusted(const char* host) {
    MessageBox(NotTrustedText(host).c_str(), B_STOP_ALERT);
}

bool GetHomeDir(char (&out)[PathBufferSize]) {
    app_info info;
    be_app->GetAppInfo(&info);
    const std::string& program = info.ref.path;
    const std::size_t slash = program.rfind('/');
    const bool fits = CopyText(out, std::string_view(program).substr(0, slash == program.npos ? 0 : slash));
    if (!fits)
        out[0] = '\0';
    return fits;
}

BView* AddTopView(BWindow& window) {
    auto* view = new BView(window.Bounds(), "top view", B_FOLLOW_ALL_SIDES, B_WILL_DRAW);
    view->SetViewColor(colors::gray);
    window.AddChild(view);
    return view;
}

void GetScreenCenter(BPoint* out) {
    const BRect screen = BScreen().Frame();
    GetBRectCenter(&screen, out);
}

void GetBRectCenter(const BRect* rect, BPoint* out) {
    *out = {(rect->left + rect->right) * 0.5F, (rect->top + rect->bottom) * 0.5F};
}

float GetFontHeight(const BFont* font) {
    font_height height;
    font->GetHeight(&height);
    return height.ascent + height.descent + height.leading;
}

BFont FittingFont(BFont font, const std::string& text, float width, float leastSize) {
    leastSize = std::min(leastSize, font.Size()); // which may be smaller already
    const float wanted = font.StringWidth(text.c_str());
    if (wanted > width)
        font.SetSize(std::max(font.Size() * width / wanted, leastSize));
    while (font.StringWidth(text.c_str()) > width && font.Size() > leastSize) // not quite in proportion
        font.SetSize(std::max(font.Size() - SizeStep, leastSize));
    return font;
}

float GetFontGrowth() {
    return std::max(be_plain_font->StringWidth(SampleText) / UsualSampleWidth, 1.0F);
}

BWindow* GetAppWindow(const BApplication* app, const char* title) {
    BWindow* window = nullptr;
    for (int32 i = 0; (window = app->WindowAt(i)) != nullptr; ++i) {
        if (window->LockWithTimeout(WindowLockPatience) != B_OK)
            continue;
        const bool found = std::strcmp(window->Title(), title) == 0;
        window->Unlock();
        if (found)
            return window;
    }
    return nullptr;
}

void DrawText(BView* view, const BRect* rect, const char* text, uint8 flags) {
    font_height height;
    view->GetFontHeight(&height);
    const float textWidth = std::ceil(view->StringWidth(text));
    const float textHeight = std::ceil(height.ascent + height.descent);
    BPoint center;
    GetBRectCenter(rect, &center);

    float x = rect->left;
    if (flags & DrawTextCenter)
        x = center.x - textWidth * 0.5F;
    else if (flags & DrawTextRight)
        x = rect->right - textWidth - 2;
    float y = rect->top + height.ascent;
    if (flags & DrawTextMiddle)
        y += (rect->bottom - rect->top - textHeight) * 0.5F;
    else if (flags & DrawTextBottom)
        y = rect->bottom - height.descent;
    view->MovePenTo(std::max(x, rect->left), std::min(y, rect->bottom));

    BRegion before;
    view->GetClippingRegion(&before);
    const BRegion inside(*rect);
    view->ConstrainClippingRegion(&inside);
    view->DrawString(text);
    view->ConstrainClippingRegion(&before);
}

void SetColor(rgb_color* color, uint8 redPart, uint8 greenPart, uint8 bluePart) {
    *color = {redPart, greenPart, bluePart, 255};
}

void ThreeDRectangle(BView* view, const BRect* rect, uint8 sunken) {
    const rgb_color lit = sunken ? colors::dark_gray : colors::white;
    const rgb_color shaded = sunken ? colors::white : colors::dark_gray;
    const float penSize = view->PenSize();
    view->SetPenSize(2);
    view->MovePenTo(rect->left, rect->top);
    view->SetHighColor(lit);
    view->StrokeLine({rect->right, rect->top});
    view->SetHighColor(shaded);
    view->StrokeLine({rect->right, rect->bottom});
    view->StrokeLine({rect->left, rect->bottom});
    view->SetHighColor(lit);
    view->StrokeLine({rect->left, rect->top});
    view->SetPenSize(penSize);
}
