#pragma once

/// Opens the first framebuffer device there is, unless one is open already. False if there is none.
bool OpenFramebuffer();

/// Learns the mode that the framebuffer's driver has, maps its memory and fills `GrScreen`. The driver's mode
/// is never changed; in 8-bit modes its colour map is. The references receive size and depth, on success
/// only; `mode` is ignored. False, with the reason on the standard error stream, if the mode cannot be
/// learned or is not supported: there is no context then, though the memory may be mapped. On the
/// application's thread.
bool GrSetVideoMode(unsigned& width, unsigned& height, unsigned& depth, unsigned mode);

/// Unmaps the framebuffer's memory and closes its device. `GrScreen` keeps the dead descriptor: the library
/// serves one session a process.
void CloseFramebuffer();
