#pragma once

/// The VGA graphics controller of the 4-plane mode. Its registers belong to the whole machine: they are
/// written under the screen's lock, or before anybody draws.

/// Asks the kernel for the ports of the graphics controller, which only the 4-plane mode touches. Where it
/// refuses, that mode is not to be had anyway, so there is no result. Each thread has permissions of its own.
void RequestVgaPorts();

/// Writes a register: its index in the low byte, its value in the high one. Without permission for the ports
/// the process ends here.
void WriteVgaPort(unsigned word);

/// Register words that are constants.
enum GrVgaWord : unsigned {
    GrVgaEnableSetReset = 0x0F01,
    GrVgaReplace = 0x0003,       ///< stores replace what there is
    GrVgaXor = 0x1803,           ///< they are combined with the latches by exclusive or
    GrVgaWritePixels = 0x0005,   ///< write mode 0: a byte is 8 bits of a plane
    GrVgaWriteLatches = 0x0105,  ///< write mode 1: the planes take what the latest load found there
    GrVgaWriteColor = 0x0205,    ///< write mode 2: a byte is a colour, for the pixels that are let through
    GrVgaMaskAll = 0xFF08,       ///< all 8 pixels are let through
};
