#pragma once

#include <tessella/export.h>

/// Starts the session: opens the framebuffer device, maps its memory in the mode that the kernel's driver
/// has, and clears the screen. In 8-bit modes it loads a colour map. The mode itself is never changed.
///
/// The calling thread becomes the application's thread: it holds the library from now on, and the functions
/// below are for it alone unless they say otherwise. SIGUSR1 gets a handler that does nothing, and keeps it.
/// SIGSEGV gets one, for good, that gives the console back by `GrDone`, reports the fault on the standard
/// error stream and aborts.
///
/// The console is taken: its keyboard gives key codes, read on a thread of the library's own, the terminal
/// passes bytes on as they are, and the kernel keeps its text off the screen. SIGUSR2 gets the handler for
/// console switches, and keeps it. A program that ends without `GrDone` leaves the console like this. The
/// layouts of the keys are those of the language that the environment names (LC_ALL, LC_MESSAGES, LANG) when
/// the session begins. The session goes on without keys if no tty opens, which is told on the standard error
/// stream, or if the layouts cannot be read, which is not.
///
/// When the user changes to another console, what is being drawn on other threads while the pointer is in use
/// is waited for. Until the return nothing is due for paint and no keys come; once the mouse has moved, calls
/// that look for input or the pointer wait, too. What the application's thread draws all the same shows on
/// the other console. Then all of the screen is due, a `GrGetEvent` that waits returns false, and of the
/// modifiers only the locks are left. The signal has to find the application's thread: others must block
/// SIGUSR2.
///
/// The mouse device is opened, if there is one, and read on a thread of the library's own, which takes no
/// signals. The pointer begins in the middle of the screen. All of the screen is due for paint.
///
/// `width`, `height` and `depth` are results only: they receive the size in pixels and the colour depth.
/// `mode` is ignored.
///
/// False, with the references unchanged, if a session is started or has ended in this process, if there is no
/// framebuffer device, or if its mode cannot be learned or is not supported. In the last two cases, and after
/// the end of a session, the reason stands on the standard error stream, the device stays open, the
/// console stays taken, and `GrDone` does nothing. Memory that cannot be mapped is told there too, but is no
/// failure: nothing is painted then.
GR_API bool GrInit(unsigned& width, unsigned& height, unsigned& depth, unsigned mode);

/// Ends the session: clears the screen, ends the input threads, gives the console back as it was, unmaps and
/// closes the framebuffer. Does nothing if there is no session. The windows must have been destroyed before,
/// and other threads have given the library back. Called on the thread that started it. Contexts of the
/// screen may still be deleted, and draw nothing; `GrScreen` keeps what it held, but for the context and the
/// memory.
GR_API void GrDone();

/// Looks again at the mode that the driver has now and rebuilds `GrScreen` for it. All of the screen is due
/// for paint then, the pointer goes to the middle, and no cursor is current. If the size is another one, the
/// callback of windows gets `GrEventWindowChanged` for the root. Contexts of the screen, and images in the
/// screen's format, that were made before must not be used any more. References and `mode` are as for
/// `GrInit`.
///
/// False on failure, with the references unchanged and the reason on the standard error stream. The session
/// is then without a context, and nothing may be drawn, on images of the screen's format either, until a
/// later call succeeds. It fails before a session and after it.
GR_API bool GrChangeMode(unsigned& width, unsigned& height, unsigned& depth, unsigned mode);

/// Whether the monitor can be asked about itself; always false. Any thread.
GR_API bool GrIsDdcSupport();

/// Whether the monitor can show a mode of `width` by `height` pixels at `rate` hertz; always false, since no
/// mode is ever set. Any thread.
GR_API bool GrIsRefreshRateValid(unsigned width, unsigned height, unsigned rate);

/// Sounds the console's bell, through the standard output stream. Any thread.
GR_API void GrBeep();
