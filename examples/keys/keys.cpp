// A picture of the keyboard. Keys that are held light up, lock keys have a lamp, and a dead key glows until
// it has met its letter. A key is labelled as on an American keyboard, until it shows what it types. The
// latest events stand below, and all of them on the standard output. Escape ends, when it is released.
//
// The screen belongs to the picture, so the output is read elsewhere: keys >events.txt
#include "keyboard.h"

#include <algorithm>
#include <cstdio>
#include <deque>
#include <iostream>
#include <map>
#include <memory>
#include <optional>
#include <set>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace {

constexpr GrColor kGround = GrMakeColor(28, 36, 48), kGroundDots = GrMakeColor(34, 44, 58);
constexpr GrColor kCase = GrMakeColor(72, 80, 96), kCaseEdge = GrMakeColor(112, 122, 140);
constexpr GrColor kWell = GrMakeColor(44, 50, 62), kLampOff = GrMakeColor(24, 40, 32);
constexpr GrColor kLocked = GrMakeColor(96, 240, 112);
constexpr GrColor kInk = GrMakeColor(40, 40, 48), kEventInk = GrMakeColor(200, 212, 228);

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

std::vector<Key> const keyboard = BuildKeyboard();
std::set<std::uint32_t> held;             // keys, as `KeyOf` names them
std::uint32_t locks = 0;                  // flags of modifiers
std::optional<std::uint32_t> deadKey;     // the one that waits for its letter
std::map<std::uint32_t, char16_t> typed;  // what keys have typed last in this layout
std::deque<std::u16string> events;        // the latest ones, as many as there is room for
bool eventsAreNew = false;                // some of them have not been painted

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

struct Fonts {
    std::unique_ptr<GrFont> letters, words;  // on keys
    std::unique_ptr<GrFont> events;
};
std::optional<Fonts> fonts;
GrRect eventPlace;  // below the keyboard

std::unique_ptr<GrFont> NewFont(int pixels)
{
    // A size is in 1000ths of an inch, of which 96 pixels make one.
    auto const size = static_cast<unsigned>(pixels * 1000 + 48) / 96;
    return std::unique_ptr<GrFont>(GrFont::Create("scalable", size, false, 400, true, false));
}

void PlaceKeyboard(int width, int height)
{
    unit = std::max(1, std::min(width / (kWide + 6), height / (kHigh + 6)));
    left = (width - kWide * unit) / 2;
    top = (height - kHigh * unit) / 2;
    eventPlace = {left, top + (kHigh + 4) * unit, width, height};
    fonts = Fonts{NewFont(2 * unit), NewFont(unit + 1), NewFont(13)};
}

void Write(GrContext& context, GrFont& font, int x, int y, std::u16string_view text, GrColor color)
{
    context.SetForeColor(color);
    context.DrawTextW(x, y, reinterpret_cast<unsigned short const*>(text.data()),
        static_cast<unsigned>(text.size()), &font, true);
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

/// A letter stands in the middle, a word in the lower left corner.
void DrawLabel(GrContext& context, Key const& key, GrRect const& face)
{
    auto const found = typed.find(key.vk);
    auto const label = key.isLetter && found != typed.end() ? std::u16string(1, found->second) : LabelOf(key);
    GrFont& font = key.isLetter ? *fonts->letters : *fonts->words;
    auto const width = static_cast<int>(font.GetTextWidthW(
        reinterpret_cast<unsigned short const*>(label.data()), static_cast<unsigned>(label.size())));
    int const height = static_cast<int>(font.GetHeight()), ascent = static_cast<int>(font.GetAscent());
    if (key.isLetter)
        Write(context, font, (face.x1 + face.x2 - width) / 2, (face.y1 + face.y2 - height) / 2 + ascent,
            label, kInk);
    else
        Write(context, font, face.x1 + 1, face.y2 - height + ascent, label, kInk);
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
    DrawLabel(context, key, face);
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
    int baseline = eventPlace.y1 + static_cast<int>(fonts->events->GetAscent());
    for (auto const& line : events) {
        Write(*context, *fonts->events, eventPlace.x1, baseline, line, kEventInk);
        baseline += static_cast<int>(fonts->events->GetHeight());
    }
    event.window->FreeContext(context);
}

/// Adds an event to those below the keyboard.
void List(std::string const& text)
{
    events.emplace_back(text.begin(), text.end());
    int const lines = (eventPlace.y2 - eventPlace.y1) / static_cast<int>(fonts->events->GetHeight());
    while (static_cast<int>(events.size()) > lines)
        events.pop_front();
    eventsAreNew = true;
    std::puts(text.c_str());
    std::fflush(stdout);
}

std::string Hex(unsigned number, int digits)
{
    std::string text;
    while (digits-- > 0)
        text += "0123456789ABCDEF"[number >> 4 * digits & 15];
    return text;
}

void ListKey(GrEvent const& event)
{
    static constexpr std::pair<std::uint32_t, char const*> kNames[] = {{GrModShift, " shift"},
        {GrModRightShift, " right-shift"}, {GrModCapsLock, " caps-lock"}, {GrModControl, " control"},
        {GrModAlt, " alt"}, {GrModRightAlt, " right-alt"}, {GrModNumLock, " num-lock"},
        {GrModScrollLock, " scroll-lock"}, {GrModInsert, " insert"}};
    std::string text = event.type == GrEventKeyDown ? "down" : "up  ";
    text += " vk " + Hex(event.vk, 4) + " chars " + std::to_string(event.charCount);
    for (auto const character : std::span(event.chars).first(event.charCount))
        text += " U+" + Hex(character, 4);
    text += " repeat " + std::to_string(event.repeat) + " modifiers " + Hex(event.modifiers, 3);
    for (auto const& [flag, name] : kNames)
        if (event.modifiers & flag) text += name;
    text += event.window ? " window some time " : " window none time ";
    text += std::to_string(event.time);
    List(text);
}

void ListLayout(char16_t const* name)
{
    std::u16string_view const characters(name);
    List("layout " + std::string(characters.begin(), characters.end()));
}

void OnWindowEvent(GrEvent const& event)
{
    if (event.type != GrEventLayoutChanged) return;
    typed.clear();
    GrWindow::RootWindow()->Invalidate();
    ListLayout(event.layoutName);
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
    if (pressed && event.charCount != 0 && event.chars[0] > ' ')
        typed[key] = static_cast<char16_t>(event.chars[event.charCount - 1]);
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
    PlaceKeyboard(static_cast<int>(width), static_cast<int>(height));
    if (char16_t const* const name = GrGetKeyboardLayout()) ListLayout(name);
    for (GrEvent event;;) {
        // Who types fast does not wait for the picture.
        if (eventsAreNew && !GrHasEvent()) {
            GrWindow::RootWindow()->Invalidate(eventPlace);
            eventsAreNew = false;
        }
        if (!GrGetEvent(event, nullptr)) continue;
        if (event.type == GrEventPaint) Paint(event);
        if (event.type != GrEventKeyDown && event.type != GrEventKeyUp) continue;
        ListKey(event);
        if (event.type == GrEventKeyUp && event.vk == GrVkEscape) break;
        Show(event);
    }
    fonts.reset();
    GrDone();
}
