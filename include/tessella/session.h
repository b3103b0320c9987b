#pragma once

#include <tessella/export.h>

/// Starts the session: opens the framebuffer device, maps its memory in the mode that the kernel's driver
/// has, and clears the screen. There is one session a process, and it cannot be started again once it has
/// ended. The calling thread becomes the application's thread.
///
/// `width`, `height` and `depth` are results only: they receive the size in pixels and the colour depth. The
/// library never changes the mode. `mode` is ignored.
///
/// False if the session is started already, if there is no framebuffer device, or if its mode cannot be
/// learned or is not supported; in the last two cases the reason stands on the standard error stream. The
/// references then keep their values.
GR_API bool GrInit(unsigned& width, unsigned& height, unsigned& depth, unsigned mode);

/// Ends the session: clears the screen and gives everything back. Does nothing if there is none. Called on the
/// application's thread.
GR_API void GrDone();

/// Looks again at the mode that the driver has now and rebuilds `GrScreen` for it; contexts of the screen made
/// before must not be used any more. References and `mode` as for `GrInit`. False on failure, with
/// the reason on the standard error stream; the session is then without a context until a later call succeeds.
/// Called on the application's thread.
GR_API bool GrChangeMode(unsigned& width, unsigned& height, unsigned& depth, unsigned mode);

/// Whether the monitor can be asked about itself; always false.
GR_API bool GrIsDdcSupport();

/// Whether the monitor can show a mode at the given refresh rate; always false, since no mode is ever set.
GR_API bool GrIsRefreshRateValid(unsigned width, unsigned height, unsigned rate);

/// Sounds the console's bell. Any thread.
GR_API void GrBeep();
