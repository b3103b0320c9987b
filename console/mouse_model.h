#pragma once

#include <console/state.h>

#include <array>
#include <cstddef>
#include <span>

namespace console {

/// The kernel's mouse multiplexer, which speaks PS/2 with a program: every byte written is acknowledged, the
/// id says which packets come, and a sequence of sample rates turns on the wheel. The bytes travel through a
/// socket pair; the model writes at its far end. All programs share one end, so one at a time can have the
/// mouse.
///
/// An answer replaces the one before if that wasn't read: a program that writes six bytes and reads none
/// finds a single acknowledgement. Therefore the answer must be there before the write returns, and is given
/// in the writing process.
class MouseModel {
public:
    explicit MouseModel(State& shared) : state(shared), mouse(shared.mouseState) {}

    /// A program opens the device: the protocol is the plain one again, and nothing is left to be read. `fd`
    /// is the program's end, here and below. The caller holds the state.
    void OnOpen(int fd);

    /// Takes in what a program wrote. The caller holds the state.
    void OnWrite(int fd, std::span<unsigned char const> bytes);

    /// Moves the mouse and reports it if a program has ever opened the device. `dy` grows downward, `wheel`
    /// is positive away from the user, `buttons` has bit 0 for left, bit 1 for right, bit 2 for middle. False
    /// if the program has let so much pile up that something was lost. The caller holds the state and the far
    /// end.
    bool Move(int dx, int dy, int wheel, unsigned buttons);

private:
    struct Packet {
        std::array<unsigned char, 4> bytes{};
        std::size_t length = 0;
    };

    /// Takes from the movement what one packet can hold.
    Packet TakePacket(int& dx, int& dy, int& dz) const;
    void MatchSequences(unsigned char byte);
    void Answer(int fd, unsigned char byte);

    State& state;
    MouseState& mouse;
};

}
