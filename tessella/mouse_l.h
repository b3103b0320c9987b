#pragma once

/// Opens the mouse device, unless it is open, and asks it for packets with a wheel. Without a device,
/// `mouseFd` stays -1.
void GrMouseOpen();

/// Starts the thread that reads the device, unless it was started before. Each packet is reported.
void StartMouseThread();

/// Ends the thread and closes the device, if the thread was started.
void StopMouseThread();
