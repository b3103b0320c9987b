#pragma once

#include <cstdint>
#include <memory>

struct GrEvent;
class GrKeyLayout;
class si_file;

/// The keyboard as the library sees it, whatever device is behind: what is down, which locks are on, and the
/// layouts that there are. All operations belong to the application's thread.
class GrKeyboard {
public:
    GrKeyLayout* layout = nullptr;       ///< the one in force; null as long as none is loaded
    bool keysDown[128] = {};             ///< by key code
    std::uint32_t modifiers = 0;         ///< `GrModShift` and the others
    std::uint32_t heldLocks = 0;         ///< those of the lock keys that are down: they have had their effect
    GrKeyLayout* firstLayout = nullptr;  ///< the list of layouts, which is owned
    GrKeyLayout* lastLayout = nullptr;

    // Moving the pointer by keys: whom to tell when it is turned on or off, and whether it is on.
    void (*emulationNotify)(void* user, bool active) = nullptr;
    void* emulationUser = nullptr;
    bool emulationActive = false;

    GrKeyboard() = default;
    GrKeyboard(GrKeyboard const&) = delete;
    GrKeyboard& operator=(GrKeyboard const&) = delete;
    virtual ~GrKeyboard();

    /// Makes a key event of a byte of the device: a key code, with bit 7 set at the release. Without a layout
    /// the event is left alone; a key that does nothing in the layout has the virtual key code 0.
    virtual void TranslateScan(GrEvent& event, unsigned char byte) = 0;
    virtual unsigned GetModifiers() { return modifiers; }

    /// The lights, in the kernel's form: scroll lock 1, num lock 2, caps lock 4.
    virtual unsigned GetLeds() = 0;
    virtual void SetLeds(unsigned leds) = 0;

    /// True if a byte of the device waits to be taken.
    virtual bool HasKey() = 0;
    /// Takes one and translates it. The event is left alone if there is none, or it is 0.
    virtual void GetKey(GrEvent& event) = 0;
    /// A place in the table of operations that means nothing.
    virtual unsigned ReservedHook() { return 0; }

    /// The virtual key code of the key that types a character, 0 if none does.
    virtual unsigned FindVkForChar(unsigned ch) { return ch; }
    virtual bool SwitchToConsole(int /*number*/) { return false; }

    /// Gets the device ready; false if no keys will come.
    virtual bool Open();
    virtual bool Close() { return true; }
    /// The console has come back, and nobody knows what was pressed meanwhile.
    virtual void Resync() {}

    /// What a key does beside being told to the application.
    virtual void OnKeyChange(unsigned /*vk*/, bool /*pressed*/) {}
    /// The lock key of the flag `mask` was pressed or released.
    virtual void ToggleLock(unsigned /*mask*/, bool /*pressed*/) {}

protected:
    /// Takes the locks that the lights show, and no other modifiers.
    void SyncLockState();
};

/// All that a keyboard does without an operating system: modifiers, locks, dead keys and layouts.
class GrSmartKeyboard : public GrKeyboard {
public:
    void TranslateScan(GrEvent& event, unsigned char byte) override;
    unsigned FindVkForChar(unsigned ch) override;
    bool Open() override;
    bool Close() override;
    void OnKeyChange(unsigned vk, bool pressed) override;
    void ToggleLock(unsigned mask, bool pressed) override;

    /// Adds the layouts of a file `keyboard.kbd` to the list; the first one is in force if none was. The
    /// archive has one for each language. False if there is none, or it is not whole.
    virtual bool LoadLayouts(char const* name);
    /// The same with an open file, which may be null. Once a keyboard: the layouts point into the file's
    /// bytes.
    virtual bool LoadLayoutStream(si_file* stream);
    /// Control and shift were pressed together: the next layout of the list, after the last one the first, is
    /// in force from now on, and the window callback is told.
    virtual void NextLayout();

private:
    void Append(std::unique_ptr<GrKeyLayout> added);
    void ComposeDeadKey(GrEvent& event);
    void HoldModifier(std::uint32_t flags, bool pressed);
    void HoldChordKey(std::uint32_t flags, unsigned key, bool pressed);

    std::unique_ptr<unsigned char[]> layoutFile;  ///< the layouts are views of it
    unsigned chord = 0;          ///< which of control and shift are down, with no other key pressed since
    unsigned deadCharacter = 0;  ///< of the dead key that waits for a letter
    unsigned deadVk = 0;         ///< its virtual key code, for whoever looks with a debugger
    int deadIndex = -1;          ///< its number in the layout; -1 if none waits
};

/// The keyboard of the session, null before the first. It stays set when a session has ended: there is one a
/// process.
extern GrKeyboard* sessionKeyboard;
