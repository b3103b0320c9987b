#include <console/mouse_model.h>

#include <algorithm>
#include <cerrno>

#include <sys/socket.h>

namespace console {

namespace {

using Sequence = std::array<unsigned char, 6>;
constexpr Sequence kWheelSequence = {0xF3, 200, 0xF3, 100, 0xF3, 80};
constexpr Sequence kExplorerSequence = {0xF3, 200, 0xF3, 200, 0xF3, 80};

constexpr unsigned char kAcknowledge = 0xFA;

/// True if the byte completes the sequence.
bool Advance(Sequence const& sequence, unsigned& matched, unsigned char byte)
{
    matched = byte == sequence[matched] ? matched + 1 : 0;
    if (matched < sequence.size()) return false;
    matched = 0;
    return true;
}

void Drain(int fd)
{
    std::array<char, 256> unread{};
    while (recv(fd, unread.data(), unread.size(), MSG_DONTWAIT) > 0) {
    }
}

bool Send(int fd, unsigned char const* bytes, std::size_t length)
{
    return send(fd, bytes, length, MSG_DONTWAIT | MSG_NOSIGNAL) == static_cast<ssize_t>(length);
}

/// Takes as much from a distance as one byte of a packet carries.
int Take(int& distance, int limit)
{
    int const part = std::clamp(distance, -limit, limit);
    distance -= part;
    return part;
}

}

void MouseModel::OnOpen(int fd)
{
    mouse.protocol = MouseProtocol::Plain;
    mouse.wheelMatched = mouse.explorerMatched = 0;
    Drain(fd);
}

void MouseModel::OnWrite(int fd, std::span<unsigned char const> bytes)
{
    int const errnoBefore = errno;
    for (auto const byte : bytes) {
        MatchSequences(byte);
        Answer(fd, byte);
    }
    errno = errnoBefore;
}

void MouseModel::MatchSequences(unsigned char byte)
{
    if (Advance(kExplorerSequence, mouse.explorerMatched, byte)) mouse.protocol = MouseProtocol::Explorer;
    if (Advance(kWheelSequence, mouse.wheelMatched, byte)) mouse.protocol = MouseProtocol::Wheel;
}

void MouseModel::Answer(int fd, unsigned char byte)
{
    std::array<unsigned char, 5> answer = {kAcknowledge};
    std::size_t length = 1;
    switch (byte) {
    case 0xEB: {  // poll
        int dx = 0;
        int dy = 0;
        int dz = 0;
        auto const packet = TakePacket(dx, dy, dz);
        std::copy_n(packet.bytes.begin(), packet.length, answer.begin() + 1);
        length += packet.length;
        break;
    }
    case 0xF2:  // get the id
        answer[length++] = static_cast<unsigned char>(mouse.protocol);
        break;
    case 0xE9:  // get the settings: 4 counts a millimetre, 200 samples a second
        answer = {kAcknowledge, 0x60, 3, 200};
        length = 4;
        break;
    case 0xFF:  // reset
        mouse.protocol = MouseProtocol::Plain;
        mouse.wheelMatched = mouse.explorerMatched = 0;
        answer = {kAcknowledge, 0xAA, 0x00};
        length = 3;
        break;
    default: break;
    }
    Drain(fd);
    Send(state.mouseDeviceFd, answer.data(), length);
}

MouseModel::Packet MouseModel::TakePacket(int& dx, int& dy, int& dz) const
{
    Packet packet;
    packet.bytes[0] =
        static_cast<unsigned char>(0x08 | (dx < 0 ? 0x10 : 0) | (dy < 0 ? 0x20 : 0) | (mouse.buttons & 7));
    packet.bytes[1] = static_cast<unsigned char>(Take(dx, 127));
    packet.bytes[2] = static_cast<unsigned char>(Take(dy, 127));
    packet.length = 3;
    if (mouse.protocol == MouseProtocol::Plain) {
        dz = 0;
    } else {
        bool const explorer = mouse.protocol == MouseProtocol::Explorer;
        packet.bytes[3] = static_cast<unsigned char>(Take(dz, explorer ? 7 : 127) & (explorer ? 0x0F : 0xFF));
        packet.length = 4;
    }
    return packet;
}

bool MouseModel::Move(int dx, int dy, int wheel, unsigned buttons)
{
    mouse.buttons = buttons;
    if (state.mouseOpens.load(std::memory_order_acquire) == 0) return true;
    int up = -dy;  // a mouse counts upward
    int dz = -wheel;
    do {
        auto const packet = TakePacket(dx, up, dz);
        if (!Send(state.mouseDeviceFd, packet.bytes.data(), packet.length)) return false;
    } while (dx != 0 || up != 0 || dz != 0);
    return true;
}

}
