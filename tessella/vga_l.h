#pragma once

/// Asks the kernel for the ports of the VGA graphics controller, which only the 4-plane mode touches. Where
/// it refuses, that mode is not to be had anyway, so there is no result.
void RequestVgaPorts();
