#include <tessella/mouse_l.h>

#include <common/assert.h>
#include <tessella/mouse.h>
#include <tessella/thread_l.h>

#include <array>

#include <fcntl.h>
#include <unistd.h>

namespace {

constexpr char kSource[] = GR_SOURCE("tessella/mouse_l");

constexpr unsigned char kAcknowledge = 0xFA;
constexpr unsigned char kWheelMouse = 3;

// Sample rates of 200, 100 and 80, in this order, turn on the wheel of a mouse that has one.
constexpr unsigned char kTurnOnWheel[] = {0xF3, 0xC8, 0xF3, 0x64, 0xF3, 0x50};
constexpr unsigned char kAskForId[] = {0xF2};

InputThread mouseThread;

/// 0 if there is nothing to read, which no answer looks like.
unsigned char ReadByte()
{
    unsigned char byte = 0;
    return read(mouseFd, &byte, 1) == 1 ? byte : 0;
}

/// Waits for a packet. What comes in other sizes is no packet.
std::span<unsigned char const> ReadPacket(std::array<unsigned char, 4>& buffer)
{
    std::size_t const size = mouseWheel ? 4 : 3;
    while (read(mouseFd, buffer.data(), size) != static_cast<ssize_t>(size)) {
    }
    return {buffer.data(), size};
}

void* ReadMouse(void*)
{
    std::array<unsigned char, 4> buffer{};
    while (mouseThread.WaitForInput({&mouseFd, 1}, InputThread::PollFailure::Ignored) != -1) {
        MousePacket const packet = DecodeMousePacket(ReadPacket(buffer));
        GrMouseReport(packet.buttons, packet.dx, packet.dy, packet.wheel);
    }
    return nullptr;
}

}

void GrMouseOpen()
{
    if (mouseFd != -1) return;
    for (char const* const device : {"/dev/mice", "/dev/input/mice"})
        if (mouseFd == -1) mouseFd = open(device, O_RDWR);
    if (mouseFd == -1) return;
    // What a device makes of these shows in its answers.
    [[maybe_unused]] ssize_t written = write(mouseFd, kTurnOnWheel, sizeof kTurnOnWheel);
    written = write(mouseFd, kAskForId, sizeof kAskForId);
    unsigned char const c = ReadByte();
    GR_ASSERT_TEXT(c == kAcknowledge, "c==0xFA");
    if (ReadByte() == kWheelMouse) mouseWheel = true;
}

void StartMouseThread()
{
    if (!mouseThread.WasStarted()) mouseThread.Start(ReadMouse, nullptr);
}

void StopMouseThread()
{
    if (!mouseThread.WasStarted()) return;
    mouseThread.Stop();
    close(mouseFd);
}
