// A picture of the keyboard. Keys that are held light up, lock keys have a lamp, and a dead key glows until
// it has met its letter. Each event stands in full on the standard output. Escape ends, when it is released.
//
// The screen belongs to the picture, so the output is read elsewhere: keys >events.txt
#include <tessella.h>

#include <algorithm>
#include <array>
#include <cstdio>
#include <iostream>
#include <optional>
#include <set>
#include <span>
#include <string_view>
#include <vector>

namespace {

constexpr GrColor kGround = GrMakeColor(28, 36, 48), kGroundDots = GrMakeColor(34, 44, 58);
constexpr GrColor kCase = GrMakeColor(72, 80, 96), kCaseEdge = GrMakeColor(112, 122, 140);
constexpr GrColor kWell = GrMakeColor(44, 50, 62), kLampOff = GrMakeColor(24, 40, 32);
constexpr GrColor kLocked = GrMakeColor(96, 240, 112);

/// Of a key cap: its face, the light on its upper edge, and its sides.
struct CapColors {
    GrColor face, light, side;
};
constexpr CapColors kLetter = {
    GrMakeColor(236, 232, 220), GrMakeColor(255, 255, 252), GrMakeColor(160, 154, 140)};
constexpr CapColors kFunction = {
    GrMakeColor(172, 178, 188), GrMakeColor(204, 208, 216), GrMakeColor(108, 114, 126)};
constexpr CapColors kHeld = {GrMakeColor(255, 168, 32), GrMakeColor(255, 212, 128), GrMakeColor(176, 96, 8)};
constexpr CapColors kDead = {GrMakeColor(64, 152, 248), GrMakeColor(144, 200, 255), GrMakeColor(24, 80, 168)};

struct Key {
    std::uint32_t vk;
    GrRect place;  // in quarters of a key's side, from the corner of the keyboard
    bool isLetter;
};

/// Puts keys side by side, from left to right.
class Row {
public:
    Row(std::vector<Key>& keyboard, int left, int top) : keys(keyboard), x(left), y(top) {}
    Row& Gap(int width) { return x += width, *this; }
    Row& Letter(std::uint32_t vk, int width = 4) { return Add(vk, width, 4, true); }
    Row& Letters(std::string_view letters)
    {
        for (char const letter : letters)
            Letter(static_cast<unsigned char>(letter));
        return *this;
    }
    Row& Function(std::uint32_t vk, int width = 4, int height = 4) { return Add(vk, width, height, false); }
    Row& Functions(std::uint32_t first, int count)
    {
        for (int i = 0; i < count; ++i)
            Function(first + static_cast<unsigned>(i));
        return *this;
    }

private:
    Row& Add(std::uint32_t vk, int width, int height, bool isLetter)
    {
        keys.push_back({vk, {x, y, x + width, y + height}, isLetter});
        return Gap(width);
    }

    std::vector<Key>& keys;
    int x, y;
};

constexpr int kWide = 92, kHigh = 26;  // the keyboard, in quarters of a key's side

std::vector<Key> BuildKeyboard()
{
    std::vector<Key> keys;
    Row(keys, 0, 0)
        .Function(GrVkEscape)
        .Gap(4)
        .Functions(GrVkF1, 4)
        .Gap(2)
        .Functions(GrVkF1 + 4, 4)
        .Gap(2)
        .Functions(GrVkF1 + 8, 4);
    Row(keys, 0, 6).Letters("`1234567890-=").Function(GrVkBackspace, 8);
    Row(keys, 0, 10).Function(GrVkTab, 6).Letters("qwertyuiop{}").Letter('\\', 6);
    Row(keys, 0, 14).Function(GrVkCapsLock, 7).Letters("asdfghjkl;'").Function(GrVkReturn, 9);
    Row(keys, 0, 18)
        .Function(GrVkLeftShift, 5)
        .Letter(GrVkLessGreater)
        .Letters("zxcvbnm,")
        .Letter(GrVkPeriod)
        .Letter('/')
        .Function(GrVkRightShift, 11);
    Row(keys, 0, 22)
        .Function(GrVkLeftControl, 5)
        .Function(GrVkLeftLogo, 5)
        .Function(GrVkLeftAlt, 5)
        .Letter(' ', 25)
        .Function(GrVkRightAlt, 5)
        .Function(GrVkRightLogo, 5)
        .Function(GrVkMenu, 5)
        .Function(GrVkRightControl, 5);

    Row(keys, 62, 0).Function(GrVkSystemRequest).Function(GrVkScrollLock).Function(GrVkPause);
    Row(keys, 62, 6).Function(GrVkInsert).Function(GrVkHome).Function(GrVkPageUp);
    Row(keys, 62, 10).Function(GrVkDelete).Function(GrVkEnd).Function(GrVkPageDown);
    Row(keys, 66, 18).Function(GrVkUp);
    Row(keys, 62, 22).Function(GrVkLeft).Function(GrVkDown).Function(GrVkRight);

    Row(keys, 76, 6)
        .Function(GrVkNumLock)
        .Function(GrVkPadDivide)
        .Function(GrVkPadMultiply)
        .Function(GrVkPadSubtract);
    Row(keys, 76, 10).Letter(GrVkPad0 + 7).Letter(GrVkPad0 + 8).Letter(GrVkPad9).Function(GrVkPadAdd, 4, 8);
    Row(keys, 76, 14).Letter(GrVkPad0 + 4).Letter(GrVkPad0 + 5).Letter(GrVkPad0 + 6);
    Row(keys, 76, 18)
        .Letter(GrVkPad0 + 1)
        .Letter(GrVkPad0 + 2)
        .Letter(GrVkPad0 + 3)
        .Function(GrVkPadEnter, 4, 8);
    Row(keys, 76, 22).Letter(GrVkPad0, 8).Letter(GrVkPadDecimal);
    return keys;
}

std::vector<Key> const keyboard = BuildKeyboard();
std::set<std::uint32_t> held;          // keys, as `KeyOf` names them
std::uint32_t locks = 0;               // flags of modifiers
std::optional<std::uint32_t> deadKey;  // the one that waits for its letter

/// Some keys have two codes: those of the pad by num lock, and M by the layout.
std::uint32_t KeyOf(std::uint32_t vk)
{
    constexpr std::uint32_t kPad[] = {GrVkPadInsert, GrVkPadEnd, GrVkPadDown, GrVkPadPageDown, GrVkPadLeft,
        GrVkPadCentre, GrVkPadRight, GrVkPadHome, GrVkPadUp, GrVkPadPageUp};
    if (auto const* const found = std::ranges::find(kPad, vk); found != std::end(kPad))
        return GrVkPad0 + static_cast<std::uint32_t>(found - kPad);
    if (vk == GrVkPadDelete) return GrVkPadDecimal;
    return vk == 'M' ? 'm' : vk;
}

struct Lock {
    std::uint32_t flag, vk;
    GrRect lamp;  // above the pad; the insert key has none there, on no keyboard
};
constexpr Lock kLocks[] = {{GrModNumLock, GrVkNumLock, {77, 1, 81, 3}},
    {GrModCapsLock, GrVkCapsLock, {82, 1, 86, 3}}, {GrModScrollLock, GrVkScrollLock, {87, 1, 91, 3}},
    {GrModInsert, GrVkInsert, {}}};

/// Where things are on the screen, which is of any size.
int unit = 1;  // a quarter of a key's side, in pixels
int left = 0, top = 0;

GrRect PixelsOf(GrRect const& place)
{
    return {left + place.x1 * unit, top + place.y1 * unit, left + place.x2 * unit, top + place.y2 * unit};
}

bool Touch(GrRect const& a, GrRect const& b)
{
    return a.x1 < b.x2 && b.x1 < a.x2 && a.y1 < b.y2 && b.y1 < a.y2;
}

GrRect Inside(GrRect const& rect, int by) { return {rect.x1 + by, rect.y1 + by, rect.x2 - by, rect.y2 - by}; }

void PlaceKeyboard(int width, int height)
{
    unit = std::max(1, std::min(width / (kWide + 6), height / (kHigh + 6)));
    left = (width - kWide * unit) / 2;
    top = (height - kHigh * unit) / 2;
}

/// A rectangle without its corners.
void FillRounded(GrContext& context, GrRect const& rect, int corner, GrColor color)
{
    GrRegion shape = GrRect{rect.x1, rect.y1 + corner, rect.x2, rect.y2 - corner};
    for (int row = 0; row < corner; ++row) {
        int const in = (corner - row) * (corner - row) / corner;
        shape += GrRect{rect.x1 + in, rect.y1 + row, rect.x2 - in, rect.y1 + row + 1};
        shape += GrRect{rect.x1 + in, rect.y2 - row - 1, rect.x2 - in, rect.y2 - row};
    }
    context.SetForeColor(color);
    context.FillRegion(shape);
}

void DrawLamp(GrContext& context, GrRect const& place, bool on)
{
    FillRounded(context, place, (place.y2 - place.y1) / 3, kWell);
    FillRounded(context, Inside(place, 1), (place.y2 - place.y1) / 3, on ? kLocked : kLampOff);
}

void DrawKey(GrContext& context, Key const& key)
{
    bool const isHeld = held.contains(key.vk);
    CapColors const& colors = isHeld ? kHeld : deadKey == key.vk ? kDead : key.isLetter ? kLetter : kFunction;
    int const corner = std::max(1, unit * 2 / 5);
    GrRect const cap = Inside(PixelsOf(key.place), std::max(1, unit / 8));
    FillRounded(context, cap, corner, colors.side);
    // The face is smaller than the foot, and sinks when the key is held.
    int const sunk = isHeld ? unit / 4 : 0;
    GrRect const face = {
        cap.x1 + unit / 3, cap.y1 + unit / 6 + sunk, cap.x2 - unit / 3, cap.y2 - unit * 2 / 3 + sunk};
    FillRounded(context, face, corner, colors.light);
    FillRounded(context, {face.x1, face.y1 + 1, face.x2, face.y2}, corner, colors.face);
    if (key.vk == 'f' || key.vk == 'j') {  // found by touch
        int const middle = (face.x1 + face.x2) / 2;
        context.SetForeColor(colors.side);
        context.FillRegion(
            GrRect{middle - unit / 2, face.y2 - unit / 2, middle + unit / 2, face.y2 - unit / 3});
    }
    for (auto const& lock : kLocks)
        if (lock.vk == key.vk) {
            GrRect const lamp = {
                face.x2 - unit * 7 / 4, face.y1 + unit / 3, face.x2 - unit / 3, face.y1 + unit * 6 / 5};
            DrawLamp(context, lamp, (locks & lock.flag) != 0);
        }
}

void Paint(GrEvent const& event)
{
    static constexpr std::uint8_t kDots[8] = {0x11, 0, 0x44, 0, 0x11, 0, 0x44, 0};
    static constexpr std::uint8_t kSolid[8] = {0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF};
    GrContext* const context = event.window->GetContext();
    context->SetClipRegion(event.rect);
    context->SetBackColor(kGround);
    context->SetForeColor(kGroundDots);
    context->SetPattern(kDots, 0, 0, false);
    context->FillRegion(event.rect);
    context->SetPattern(kSolid, 0, 0, false);
    GrRect const body = PixelsOf({-2, -2, kWide + 2, kHigh + 2});
    FillRounded(*context, body, unit, kCaseEdge);
    FillRounded(*context, {body.x1 + 1, body.y1 + 2, body.x2 - 1, body.y2}, unit, kCase);
    for (auto const& block : {GrRect{0, 0, 60, 4}, GrRect{0, 6, 60, 26}, GrRect{62, 0, 74, 4},
             GrRect{62, 6, 74, 14}, GrRect{62, 22, 74, 26}, GrRect{66, 18, 70, 22}, GrRect{76, 6, 92, 26}})
        FillRounded(*context, Inside(PixelsOf(block), -unit / 4), unit / 2 + 1, kWell);
    for (auto const& key : keyboard)
        if (Touch(PixelsOf(key.place), event.rect)) DrawKey(*context, key);
    for (auto const& lock : kLocks)
        DrawLamp(*context, PixelsOf(lock.lamp), (locks & lock.flag) != 0);
    event.window->FreeContext(context);
}

void Print(GrEvent const& event)
{
    static constexpr std::pair<std::uint32_t, char const*> kNames[] = {{GrModShift, " shift"},
        {GrModRightShift, " right-shift"}, {GrModCapsLock, " caps-lock"}, {GrModControl, " control"},
        {GrModAlt, " alt"}, {GrModRightAlt, " right-alt"}, {GrModNumLock, " num-lock"},
        {GrModScrollLock, " scroll-lock"}, {GrModInsert, " insert"}};
    std::printf(
        "%s vk %04X chars %u", event.type == GrEventKeyDown ? "down" : "up  ", event.vk, event.charCount);
    for (auto const character : std::span(event.chars).first(event.charCount))
        std::printf(" U+%04X", character);
    std::printf(" repeat %u modifiers %03X", event.repeat, event.modifiers);
    for (auto const& [flag, name] : kNames)
        if (event.modifiers & flag) std::fputs(name, stdout);
    std::printf(" window %s time %u\n", event.window ? "some" : "none", event.time);
    std::fflush(stdout);
}

void PrintLayout(char16_t const* name)
{
    std::fputs("layout ", stdout);
    for (; *name != 0; ++name)
        std::putchar(static_cast<char>(*name));
    std::puts("");
}

void OnWindowEvent(GrEvent const& event)
{
    if (event.type == GrEventLayoutChanged) PrintLayout(event.layoutName);
}

/// What the event changes in the picture is due for paint.
void Show(GrEvent const& event)
{
    auto const keyBefore = deadKey;
    auto const locksBefore = locks;
    std::uint32_t const key = KeyOf(event.vk);
    bool const pressed = event.type == GrEventKeyDown;
    if (pressed)
        held.insert(key);
    else
        held.erase(key);
    // A dead key gives a character that is none. The next key that gives characters has met it.
    if (pressed && event.charCount != 0) deadKey = event.chars[0] == 0 ? std::optional(key) : std::nullopt;
    // Events tell the locks as they were before.
    locks = event.modifiers & (GrModCapsLock | GrModNumLock | GrModScrollLock | GrModInsert);
    for (auto const& lock : kLocks)
        if (lock.vk == event.vk && pressed && event.repeat == 0) locks ^= lock.flag;

    GrWindow& root = *GrWindow::RootWindow();
    for (auto const& each : keyboard)
        if (each.vk == key || each.vk == keyBefore) root.Invalidate(PixelsOf(each.place));
    for (auto const& lock : kLocks)
        if ((locks ^ locksBefore) & lock.flag) root.Invalidate(PixelsOf(lock.lamp));
}

}

int main(int, char** argv)
{
    unsigned width = 0, height = 0, depth = 0;
    if (!GrInit(width, height, depth, 0)) {
        std::cerr << argv[0] << ": no screen to draw on\n";
        return 1;
    }
    GrWindow::SetCallback(OnWindowEvent);
    if (char16_t const* const name = GrGetKeyboardLayout()) PrintLayout(name);
    PlaceKeyboard(static_cast<int>(width), static_cast<int>(height));
    for (GrEvent event;;) {
        if (!GrGetEvent(event, nullptr)) continue;
        if (event.type == GrEventPaint) Paint(event);
        if (event.type != GrEventKeyDown && event.type != GrEventKeyUp) continue;
        Print(event);
        if (event.type == GrEventKeyUp && event.vk == GrVkEscape) break;
        Show(event);
    }
    GrDone();
}
