#include <care/finding.h>

#include <array>
#include <cerrno>

#include <fcntl.h>
#include <poll.h>
#include <unistd.h>

namespace care {

namespace {

constexpr char kPart[] = "mouse";
constexpr int kPatience = 500;  // milliseconds
constexpr unsigned char kAskForId = 0xF2;
constexpr unsigned char kAcknowledge = 0xFA;
constexpr char kNoDevice[] = "Load the kernel's modules for mice: modprobe mousedev psmouse usbhid. Without "
                             "a mouse the pointer is moved "
                             "with the keyboard: F10 turns that on.";

/// Motion may come before the answer.
bool Answers(int fd)
{
    if (write(fd, &kAskForId, 1) != 1) return false;
    for (int bytes = 0; bytes < 64; ++bytes) {
        pollfd waited{fd, POLLIN, 0};
        unsigned char byte = 0;
        if (poll(&waited, 1, kPatience) != 1 || read(fd, &byte, 1) != 1) return false;
        if (byte == kAcknowledge) return true;
    }
    return false;
}

}

void CheckMouse(Findings& findings)
{
    constexpr std::array kDevices = {"/dev/mice", "/dev/input/mice"};
    for (char const* const device : kDevices) {
        int const fd = open(device, O_RDWR | O_CLOEXEC);
        if (fd == -1) continue;
        bool const answers = Answers(fd);
        close(fd);
        if (answers)
            findings.push_back({kPart, Severity::Fine, std::string(device) + " answers", {}});
        else
            findings.push_back({kPart, Severity::Unusable,
                std::string(device) + " doesn't answer as a mouse does: a session would wait for it for ever",
                "Let the kernel's mousedev provide it, or remove the device."});
        return;
    }
    int const reason = errno;  // of the last, where mice are on today's systems
    findings.push_back({kPart, Severity::Limits, CannotOpen(kDevices.back(), reason),
        MendOpening(kDevices.back(), reason, kNoDevice)});
}

}
