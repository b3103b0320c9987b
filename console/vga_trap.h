#pragma once

#include <console/vga_model.h>

#include <csignal>
#include <optional>

namespace console {

/// Lets this process' code meet a graphics controller that isn't there. A port instruction faults, since the
/// kernel has not allowed it, and is carried out on the model. So does an access to the window, which is
/// mapped without permissions: its instruction is then stepped with the window open. For a load the window
/// holds what the model gives. A store is stepped twice, with the window full of zeros and of ones: what is
/// the same both times has been stored.
///
/// Limits: while one thread's access is stepped, others of the window go unseen, so programs serialise
/// theirs; a load of several bytes leaves in the latches what its first byte has there; and an instruction
/// that both loads from the window and stores there counts as the one that faults first.

/// From now on, or with a null model no longer. The window is `VgaModel::kWindow` bytes long, at a page's
/// border, or null if there are only the ports. Window and model must outlive this. No access may be under
/// way.
void TrapVga(unsigned char* window, VgaModel* model);
bool IsVgaTrapped();

/// Stands before the program's own handling of the signals that are needed here: it is kept, and called for
/// what isn't the controller's. Gives nothing for other signals, and while nothing is trapped.
std::optional<int> HandleSignal(int signal, struct sigaction const* action, struct sigaction* before);

/// The set without the signals that no thread may block meanwhile.
sigset_t WithoutOwnSignals(sigset_t set);

}
