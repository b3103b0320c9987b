// Takes the console as a full-screen program does and prints whatever its devices say, a line for each read.
// Every byte is painted, too, as a row of the screen; all again when the console comes back.

#include <array>
#include <csignal>
#include <cstdio>
#include <cstring>
#include <vector>

#include <fcntl.h>
#include <linux/fb.h>
#include <linux/kd.h>
#include <linux/vt.h>
#include <poll.h>
#include <sys/ioctl.h>
#include <sys/mman.h>
#include <sys/signalfd.h>
#include <termios.h>
#include <unistd.h>

int main()
{
    std::setvbuf(stdout, nullptr, _IOLBF, 0);
    sigset_t wanted{};
    sigaddset(&wanted, SIGUSR2);
    sigprocmask(SIG_BLOCK, &wanted, nullptr);
    int const signals = signalfd(-1, &wanted, 0);

    int const framebuffer = open("/dev/fb0", O_RDWR);
    fb_fix_screeninfo fixed{};
    ioctl(framebuffer, FBIOGET_FSCREENINFO, &fixed);
    void* const memory = mmap(nullptr, fixed.smem_len, PROT_READ | PROT_WRITE, MAP_SHARED, framebuffer, 0);
    std::memset(memory, 0, fixed.smem_len);

    int const tty = open("/dev/tty0", O_RDONLY | O_NONBLOCK);
    termios settings{};
    tcgetattr(tty, &settings);
    cfmakeraw(&settings);
    tcsetattr(tty, TCSANOW, &settings);
    ioctl(tty, KDSKBMODE, K_MEDIUMRAW);
    ioctl(tty, KDSETMODE, KD_GRAPHICS);
    vt_mode mode{VT_PROCESS, 0, SIGUSR2, SIGUSR2, 0};
    ioctl(tty, VT_SETMODE, &mode);

    int const mouse = open("/dev/input/mice", O_RDWR);
    std::array<unsigned char, 4> bytes{};
    if (write(mouse, "\xF3\xC8\xF3\x64\xF3\x50", 6) != 6 || write(mouse, "\xF2", 1) != 1 ||
        read(mouse, bytes.data(), 1) != 1 || read(mouse, &bytes[1], 1) != 1)
        return 1;
    std::printf("mouse answers %02x %02x\n", bytes[0], bytes[1]);

    std::vector<unsigned char> rows;
    bool away = false;
    std::array<pollfd, 3> ready = {pollfd{tty, POLLIN, 0}, {mouse, POLLIN, 0}, {signals, POLLIN, 0}};
    while (poll(ready.data(), ready.size(), -1) > 0) {
        for (std::size_t i = 0; i < 2; ++i) {
            if ((ready[i].revents & POLLIN) == 0) continue;
            auto const length = read(ready[i].fd, bytes.data(), ready[i].fd == tty ? 1 : bytes.size());
            std::printf(ready[i].fd == tty ? "key" : "mouse");
            for (auto byte = bytes.begin(); byte < bytes.begin() + length; ++byte) {
                std::printf(" %02x", *byte);
                rows.push_back(*byte);
            }
            std::puts("");
        }
        signalfd_siginfo signal{};
        if ((ready[2].revents & POLLIN) != 0 && read(signals, &signal, sizeof signal) > 0) {
            away = !away;
            std::puts(away ? "released" : "acquired");
            if (!away) std::memset(memory, 0, fixed.smem_len);
            ioctl(tty, VT_RELDISP, away ? 1 : VT_ACKACQ);
        }
        for (std::size_t y = 0; y < rows.size() && !away; ++y)
            std::memset(static_cast<char*>(memory) + y * fixed.line_length, rows[y], fixed.line_length);
    }
}
