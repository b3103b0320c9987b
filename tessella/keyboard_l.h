#pragma once

/// Makes the session's keyboard and takes the console's tty for it: raw keys, read on a thread of their own,
/// graphics mode, and a say in console switches. What fails is left out, and the session goes on.
void GrKeyboardCreate();

/// Ends the thread, gives the tty back as it was and deletes the keyboard; `sessionKeyboard` stays set.
void GrKeyboardDestroy();

/// The tty that the session holds, -1 if none. For handlers of signals, too.
int ConsoleTty();

/// The number of that console, from 1; 0 if the kernel didn't tell. Likewise.
int ConsoleNumber();

/// Gives the tty back as it was and leaves all else: for a handler of signals in a session that can't be
/// ended.
void GiveConsoleBackAtOnce();

/// Has the keyboard's thread unfreeze the pump, so that the application repaints a screen that has come back.
/// For handlers of signals: it locks nothing, and leaves the rest to the thread.
void WakeAfterReturn();
