#include <console/vga_model.h>

namespace console {

namespace {

/// One byte for all planes.
constexpr std::uint32_t InAllPlanes(std::uint8_t byte) { return byte * 0x01010101U; }

/// All bits of the planes whose bit is set.
constexpr std::uint32_t PlanesOf(unsigned bits)
{
    return ((bits & 1) | (bits & 2) << 7 | (bits & 4) << 14 | (bits & 8) << 21) * 0xFF;
}

constexpr std::uint8_t RotatedRight(std::uint8_t byte, unsigned count)
{
    return static_cast<std::uint8_t>(byte >> count | byte << (8 - count));
}

}

void VgaModel::Note(VgaEvent::Kind kind, unsigned value, std::size_t offset)
{
    if (record == nullptr) return;
    if (record->count < record->room.size())
        record->room[record->count] = {
            kind, static_cast<std::uint16_t>(value), static_cast<std::uint32_t>(offset)};
    ++record->count;
}

void VgaModel::WritePort(std::uint16_t port, std::uint8_t byte)
{
    if (port == kIndexPort) {
        state->index = byte & 0x0F;
    } else if (port == kDataPort && state->index < state->registers.size()) {
        state->registers[state->index] = byte;
        Note(VgaEvent::Kind::Port, byte << 8U | state->index, 0);
    }
}

std::uint8_t VgaModel::Peek(std::size_t offset) const
{
    auto const& registers = state->registers;
    std::uint32_t const word = memory[offset];
    if ((registers[VgaState::Mode] & 8) == 0)
        return static_cast<std::uint8_t>(word >> 8 * (registers[VgaState::ReadMapSelect] & 3));
    std::uint32_t differing =
        (word ^ PlanesOf(registers[VgaState::ColourCompare])) & PlanesOf(registers[VgaState::ColourDontCare]);
    differing |= differing >> 16;
    differing |= differing >> 8;
    return static_cast<std::uint8_t>(~differing);
}

std::uint8_t VgaModel::Load(std::size_t offset)
{
    state->latches = memory[offset];
    std::uint8_t const byte = Peek(offset);
    Note(VgaEvent::Kind::Load, byte, offset);
    return byte;
}

/// The data after the function that combines it with the latches.
std::uint32_t VgaModel::Combined(std::uint32_t data) const
{
    switch (state->registers[VgaState::DataRotate] >> 3 & 3) {
    case 0: return data;
    case 1: return data & state->latches;
    case 2: return data | state->latches;
    default: return data ^ state->latches;
    }
}

void VgaModel::Store(std::size_t offset, std::uint8_t byte)
{
    Note(VgaEvent::Kind::Store, byte, offset);
    auto const& registers = state->registers;
    std::uint8_t const rotated = RotatedRight(byte, registers[VgaState::DataRotate] & 7);
    std::uint32_t const setReset = PlanesOf(registers[VgaState::SetReset]);
    std::uint32_t mask = InAllPlanes(registers[VgaState::BitMask]);
    std::uint32_t data = 0;
    switch (registers[VgaState::Mode] & 3) {
    case 0: {
        std::uint32_t const enabled = PlanesOf(registers[VgaState::EnableSetReset]);
        data = (setReset & enabled) | (InAllPlanes(rotated) & ~enabled);
        break;
    }
    case 1: memory[offset] = state->latches; return;
    case 2: data = PlanesOf(byte); break;
    default:
        data = setReset;
        mask &= InAllPlanes(rotated);
        break;
    }
    memory[offset] = (Combined(data) & mask) | (state->latches & ~mask);
}

}
