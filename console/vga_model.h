#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <span>

namespace console {

/// What the graphics controller of a VGA knows. The registers are those that decide what loads and stores do;
/// all planes are enabled and the window shows them from their first byte on, as in the 16-colour modes.
struct VgaState {
    enum Register : unsigned char {
        SetReset,        ///< a bit a plane
        EnableSetReset,  ///< likewise
        ColourCompare,   ///< likewise
        DataRotate,      ///< bits 0-2 the rotation, bits 3-4 the function: replace, and, or, xor
        ReadMapSelect,   ///< a plane
        Mode,            ///< bits 0-1 the write mode, bit 3 the read mode
        Miscellaneous,
        ColourDontCare,  ///< a bit a plane that is compared
        BitMask,
        kRegisters
    };
    std::array<std::uint8_t, kRegisters> registers{0, 0, 0, 0, 0, 0, 5, 0x0F, 0xFF};
    std::uint8_t index = 0;  ///< the register that the data port stands for
    bool portsAllowed = false;
    std::uint32_t latches = 0;  ///< a byte a plane, plane 0 in the lowest
};

/// One thing that has reached the controller.
struct VgaEvent {
    enum class Kind : unsigned char { Port, Load, Store };
    Kind kind;
    std::uint16_t value;   ///< the register's index and, above it, its value; or the byte
    std::uint32_t offset;  ///< in the window

    bool operator==(VgaEvent const&) const = default;
};

/// Events in the order in which they come. Those that the room doesn't hold are counted.
struct VgaRecord {
    std::span<VgaEvent> room;
    std::size_t count = 0;
};

/// The graphics controller with its memory: what a load gives, and what a store leaves in the four planes. It
/// does what the adapter does, whether or not that makes sense, in all write modes and both read modes.
/// Never uses the heap. Calls come one at a time.
class VgaModel {
public:
    static constexpr std::size_t kWindow = 0x10000;  ///< bytes of each plane, and of the window
    static constexpr std::uint16_t kIndexPort = 0x3CE;
    static constexpr std::uint16_t kDataPort = 0x3CF;

    constexpr VgaModel() = default;  ///< not to be used
    /// `planes` has `kWindow` words, a byte a plane in each, plane 0 in the lowest. All must outlive this.
    VgaModel(VgaState& shared, std::uint32_t* planes, VgaRecord* events = nullptr)
        : state(&shared), memory(planes), record(events)
    {}

    bool ArePortsAllowed() const { return state->portsAllowed; }
    void WritePort(std::uint16_t port, std::uint8_t byte);
    std::uint8_t Load(std::size_t offset);
    /// The same without an effect.
    std::uint8_t Peek(std::size_t offset) const;
    void Store(std::size_t offset, std::uint8_t byte);

    /// The colour of the pixel with this bit in a word of planes.
    static unsigned PixelOf(std::uint32_t word, unsigned bit)
    {
        return (word >> bit & 1) | (word >> (7 + bit) & 2) | (word >> (14 + bit) & 4) |
            (word >> (21 + bit) & 8);
    }

private:
    void Note(VgaEvent::Kind kind, unsigned value, std::size_t offset);
    std::uint32_t Combined(std::uint32_t data) const;

    VgaState* state = nullptr;
    std::uint32_t* memory = nullptr;
    VgaRecord* record = nullptr;
};

}
