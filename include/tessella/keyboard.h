#pragma once

#include <tessella/export.h>

#include <cstdint>

/// Virtual key codes, `GrEvent::vk`: which key it is, whatever the layout prints on it. A key with a
/// character has the code of the character that English keyboards have at its place, without shift: 'q' is
/// right of tab in France, too. Some layouts say 'M' instead of 'm'. Other codes than characters, and the
/// keys whose code is another character than their own, stand here.
enum : std::uint32_t {
    GrVkPeriod = 0x2A,        ///< the key right of the comma
    GrVkLeftBracket = 0x7B,   ///< the key right of p
    GrVkRightBracket = 0x7D,  ///< and the one beside it
    GrVkLessGreater = 0x9F,   ///< the key between left shift and the letters; American keyboards lack it

    GrVkBackspace = 0xFF08,
    GrVkTab = 0xFF09,
    GrVkReturn = 0xFF0D,
    GrVkPause = 0xFF13,
    GrVkScrollLock = 0xFF14,
    GrVkSystemRequest = 0xFF15,
    GrVkEscape = 0xFF1B,
    GrVkDelete = 0xFF1C,
    GrVkHome = 0xFF50,
    GrVkLeft = 0xFF51,
    GrVkUp = 0xFF52,
    GrVkRight = 0xFF53,
    GrVkDown = 0xFF54,
    GrVkPageUp = 0xFF55,
    GrVkPageDown = 0xFF56,
    GrVkEnd = 0xFF57,
    GrVkLeftLogo = 0xFF60,
    GrVkRightLogo = 0xFF61,
    GrVkInsert = 0xFF63,
    GrVkMenu = 0xFF67,
    GrVkNumLock = 0xFF7F,

    GrVkF1 = 0xFFBE,  ///< the others follow
    GrVkF10 = 0xFFC7,
    GrVkF11 = 0xFFC8,
    GrVkF12 = 0xFFC9,

    GrVkLeftShift = 0xFFE1,
    GrVkRightShift = 0xFFE2,
    GrVkLeftControl = 0xFFE3,
    GrVkRightControl = 0xFFE4,
    GrVkCapsLock = 0xFFE5,
    GrVkLeftAlt = 0xFFE9,
    GrVkRightAlt = 0xFFEA,

    // The numeric pad without num lock, or with shift.
    GrVkPadCentre = 0x7F80,
    GrVkPadEnter = 0x7F8D,  ///< its character is 0x13
    GrVkPadHome = 0x7F95,
    GrVkPadLeft = 0x7F96,
    GrVkPadUp = 0x7F97,
    GrVkPadRight = 0x7F98,
    GrVkPadDown = 0x7F99,
    GrVkPadPageUp = 0x7F9A,
    GrVkPadPageDown = 0x7F9B,
    GrVkPadEnd = 0x7F9C,
    GrVkPadInsert = 0x7F9E,
    GrVkPadDelete = 0x7F9F,
    GrVkPadMultiply = 0x7FAA,
    GrVkPadAdd = 0x7FAB,
    GrVkPadSubtract = 0x7FAD,
    GrVkPadDivide = 0x7FAF,

    // The same keys with num lock.
    GrVkPadDecimal = 0x7FAE,
    GrVkPad0 = 0x7FB0,  ///< the others follow
    GrVkPad9 = 0x7FB9
};

/// The virtual key code of the key that types the character `ch`, a UTF-16 unit, with whatever modifiers. Of
/// all layouts and keys that do, the first. 0 if none does; 0xFFFFFFFF before the session, when there is no
/// keyboard.
///
/// This and the functions below are for the application's thread, and not for after the end of the session.
GR_API unsigned GrFindVkForChar(unsigned ch);

/// The name of the layout in force, such as u"DE", with a zero behind it: UTF-16 that belongs to the library
/// and lives as long as the session. Null if there is nothing to choose: before the session, and with fewer
/// than two layouts. Users change it by pressing control and shift together, with no other key between;
/// then the window callback gets `GrEventLayoutChanged`.
GR_API char16_t const* GrGetKeyboardLayout();

/// Asks the kernel for another console, as control with alt or shift, and F1 to F10, do; the first one is 1.
/// True if the kernel has taken the request, false without a keyboard or for a console that does not exist.
/// The session lets its console go as soon as no other thread draws, and at once while no pointer is in use;
/// see `GrInit`.
GR_API bool SwitchToConsole(int number);

/// Tells when the user starts and stops moving the pointer by keys, say to show it in another colour:
/// `callback` is called at once with the present state, and then at each change, within `GrGetEvent`, on the
/// application's thread. There is one callback; null takes it away. `user` is handed to it as it is. Does
/// nothing before the session, when there is no keyboard.
///
/// F10 starts and stops it, and so do control-M, and num lock with the left shift and left alt; applications
/// do not see these keys being pressed. Meanwhile they see no keys at all. The arrows and the numeric pad
/// move the pointer, the faster the longer they are held. Blank, return, the pad's enter, and its centre
/// without num lock are the left button, menu is the right one. Of a key that is held while this starts or
/// stops, the application sees the press alone or the release alone, and a button stays down. A mouse goes on
/// working; without one the pointer is in use only meanwhile.
GR_API void GrSetMouseEmulationNotify(void (*callback)(void* user, bool active), void* user);
