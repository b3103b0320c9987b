#pragma once

#include <console/state.h>

namespace console {

/// The console driver behind the tty: keyboard and console modes, LEDs, and the switching between consoles.
/// The program sits on console 1; on all others nobody asks for a say. Any thread, any process that shares
/// the state.
class TtyModel {
public:
    explicit TtyModel(State& shared) : state(shared), tty(shared.ttyState) {}

    /// Answers one of the tty's ioctls; 0 or an error number. The argument is a number or an address, by the
    /// request. The caller holds the state, so VT_WAITACTIVE gives EAGAIN as long as it has to wait.
    int Answer(Request request, void* argument);

    /// Asks for a switch, as VT_ACTIVATE does and as the keys of another console do. 0, or ENXIO for a
    /// console that doesn't exist. The caller holds the state.
    int Activate(unsigned long console);

private:
    int SetKeyboardMode(unsigned long mode);
    int SetConsoleMode(unsigned long mode);
    int SetLeds(unsigned long leds);
    int SetVtMode(vt_mode const& mode);
    int ReleaseDisplay(unsigned long answer);
    int Await(unsigned long console) const;
    void CompleteSwitch(int console);
    bool SignalProcess(int signal) const;
    void ResetOwnConsole();

    State& state;
    TtyState& tty;
};

}
