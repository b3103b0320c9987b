#include <tessella/keyboard.h>

#include <common/zipopen.h>
#include <file/file.h>
#include <tessella/event.h>
#include <tessella/key_layout.h>
#include <tessella/keyboard_device.h>
#include <tessella/window_state.h>

#include <memory>
#include <new>
#include <utility>

GrKeyboard* sessionKeyboard = nullptr;

namespace {

constexpr unsigned char kReleased = 0x80;
constexpr char kLayoutFile[] = "keyboard.kbd";

struct Light {
    unsigned led;
    std::uint32_t lock;
};
constexpr Light kLights[] = {{4, GrModCapsLock}, {2, GrModNumLock}, {1, GrModScrollLock}};

// Bits of the chord that changes layouts.
enum : unsigned { kChordShift = 1, kChordControl = 2 };

}

GrKeyboard::~GrKeyboard()
{
    while (firstLayout)
        delete std::exchange(firstLayout, firstLayout->next);
}

bool GrKeyboard::Open()
{
    SyncLockState();
    return true;
}

void GrKeyboard::SyncLockState()
{
    unsigned const leds = GetLeds();
    modifiers = 0;
    for (auto const& light : kLights)
        if (leds & light.led) modifiers |= light.lock;
    SetLeds(leds);
}

void GrSmartKeyboard::TranslateScan(GrEvent& event, unsigned char byte)
{
    if (!layout) return;
    unsigned const scan = byte & 0x7Fu;
    bool const pressed = (byte & kReleased) == 0;
    event.repeat = pressed && keysDown[scan];
    keysDown[scan] = pressed;

    // The event has the modifiers before the key's own effect, less those that its character has used up.
    unsigned flags = modifiers;
    unsigned short ch = 0;
    event.vk = layout->Translate(scan, flags, &ch);
    event.charCount = ch != 0;
    if (ch != 0) {
        event.chars[0] = ch;
        if (pressed) ComposeDeadKey(event);
    }
    OnKeyChange(event.vk, pressed);
    event.type = pressed ? GrEventKeyDown : GrEventKeyUp;
    event.window = nullptr;
    event.time = 0;
    event.modifiers = flags;
}

/// A key with a character was pressed: it may be a dead key, or follow one. Keys without characters, such as
/// shift, may come between the two, and another layout may come into force.
void GrSmartKeyboard::ComposeDeadKey(GrEvent& event)
{
    unsigned ch = event.chars[0];
    if (deadIndex == -1) {
        deadIndex = static_cast<int>(layout->FindDeadKey(ch));
        if (deadIndex == -1) return;
        deadVk = event.vk;
        deadCharacter = ch;
        event.chars[0] = 0;
        return;
    }
    if (ch == ' ') {
        event.chars[0] = deadCharacter;
    } else if (layout->ApplyDeadKey(static_cast<unsigned>(deadIndex), ch)) {
        event.chars[0] = ch;
    } else {
        event.charCount = 2;
        event.chars[0] = deadCharacter;
        event.chars[1] = ch;
    }
    deadIndex = -1;
}

unsigned GrSmartKeyboard::FindVkForChar(unsigned ch)
{
    for (auto const* each = firstLayout; each; each = each->next)
        if (unsigned const vk = each->FindVkForChar(ch)) return vk;
    return 0;
}

bool GrSmartKeyboard::Open()
{
    SyncLockState();
    return LoadLayouts(kLayoutFile);
}

bool GrSmartKeyboard::Close()
{
    layoutFile.reset();
    return true;
}

// Keys are not counted: with both shift keys down, the release of one releases both.
void GrSmartKeyboard::OnKeyChange(unsigned vk, bool pressed)
{
    switch (vk) {
    case GrVkLeftShift: return HoldChordKey(GrModShift, kChordShift, pressed);
    case GrVkRightShift: return HoldChordKey(GrModShift | GrModRightShift, kChordShift, pressed);
    case GrVkLeftControl:
    case GrVkRightControl: return HoldChordKey(GrModControl, kChordControl, pressed);
    case GrVkLeftAlt: HoldModifier(GrModAlt, pressed); break;
    case GrVkRightAlt: HoldModifier(GrModAlt | GrModRightAlt, pressed); break;
    case GrVkCapsLock: ToggleLock(GrModCapsLock, pressed); break;
    case GrVkInsert: ToggleLock(GrModInsert, pressed); break;
    case GrVkNumLock: ToggleLock(GrModNumLock, pressed); break;
    case GrVkScrollLock: ToggleLock(GrModScrollLock, pressed); break;
    default: break;
    }
    chord = 0;
}

void GrSmartKeyboard::HoldModifier(std::uint32_t flags, bool pressed)
{
    modifiers = pressed ? modifiers | flags : modifiers & ~flags;
}

/// The layout changes at the first release of the two.
void GrSmartKeyboard::HoldChordKey(std::uint32_t flags, unsigned key, bool pressed)
{
    HoldModifier(flags, pressed);
    if (pressed) {
        chord |= key;
        return;
    }
    if (chord & ~key) NextLayout();
    chord &= ~key;
}

void GrSmartKeyboard::ToggleLock(unsigned mask, bool pressed)
{
    if (!pressed) {
        heldLocks &= ~mask;
    } else if ((heldLocks & mask) == 0) {  // else the key repeats itself
        modifiers ^= mask;
        heldLocks |= mask;
    }
    unsigned leds = 0;
    for (auto const& light : kLights)
        if (modifiers & light.lock) leds |= light.led;
    SetLeds(leds);
}

bool GrSmartKeyboard::LoadLayouts(char const* name)
{
    return LoadLayoutStream(std::unique_ptr<si_file>(ZipOpen(name)).get());
}

bool GrSmartKeyboard::LoadLayoutStream(si_file* stream)
{
    if (!stream) return false;
    auto const size = stream->Size();
    if (size < kLeastLayoutFile) return false;
    std::unique_ptr<unsigned char[]> bytes(new (std::nothrow) unsigned char[size]);
    if (!bytes) return false;  // a damaged file may claim any size
    ReadAll(*stream, bytes.get(), size);
    if (stream->error) return false;
    auto layouts = ReadKeyLayouts({bytes.get(), size});
    if (!layouts) return false;
    layoutFile = std::move(bytes);
    for (auto& each : *layouts)
        Append(std::move(each));
    return true;
}

void GrSmartKeyboard::Append(std::unique_ptr<GrKeyLayout> added)
{
    GrKeyLayout* const last = added.release();
    last->previous = lastLayout;
    (lastLayout ? lastLayout->next : firstLayout) = last;
    lastLayout = last;
    if (!layout) layout = last;
}

void GrSmartKeyboard::NextLayout()
{
    if (chord == 0) return;
    GrKeyLayout* const before = layout;
    layout = before && before->next ? before->next : firstLayout;
    if (layout == before || !Callback) return;
    GrEvent event;
    event.type = GrEventLayoutChanged;
    event.layoutName = layout->GetName();
    Callback(event);
}

bool SwitchToConsole(int number) { return sessionKeyboard && sessionKeyboard->SwitchToConsole(number); }

unsigned GrFindVkForChar(unsigned ch)
{
    return sessionKeyboard ? sessionKeyboard->FindVkForChar(ch) : 0xFFFFFFFF;
}

char16_t const* GrGetKeyboardLayout()
{
    bool const choice = sessionKeyboard && sessionKeyboard->firstLayout != sessionKeyboard->lastLayout;
    return choice && sessionKeyboard->layout ? sessionKeyboard->layout->GetName() : nullptr;
}
