// A program that uses the devices as a full-screen program does, and tells what it sees. It knows nothing of
// the virtual console.
//
//   device_probe look               opens every device, makes every request, prints one line for each
//   device_probe draw PIXEL...      puts pixels into the first row and, from the right, into the last
//   device_probe die PIXEL...       draws and kills itself
//   device_probe wait               prints "ready" and waits for a signal

#include <array>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

#include <fcntl.h>
#include <linux/fb.h>
#include <linux/kd.h>
#include <linux/vt.h>
#include <sys/io.h>
#include <sys/ioctl.h>
#include <sys/mman.h>
#include <termios.h>
#include <unistd.h>

namespace {

void Tell(char const* name, long result)
{
    std::printf("%s %s\n", name, result == -1 ? strerrorname_np(errno) : "ok");
}

int Open(std::initializer_list<char const*> paths, int flags)
{
    int fd = -1;
    for (char const* const path : paths) {
        if (fd != -1) break;
        fd = open(path, flags);
        Tell(path, fd);
    }
    return fd;
}

void Request(char const* name, int fd, unsigned long number, void* argument)
{
    Tell(name, ioctl(fd, number, argument));
}

void Number(char const* name, int fd, unsigned long number, unsigned long argument)
{
    Tell(name, ioctl(fd, number, argument));
}

void UploadRamp(int fd)
{
    std::array<std::uint16_t, 256> up{}, down{};
    for (unsigned i = 0; i < up.size(); ++i) {
        up[i] = static_cast<std::uint16_t>(i << 8);
        down[i] = static_cast<std::uint16_t>(0xFF00 - (i << 8));
    }
    fb_cmap map{0, 256, up.data(), down.data(), up.data(), nullptr};
    Request("FBIOPUTCMAP", fd, FBIOPUTCMAP, &map);
}

void LookAtFramebuffer(int flags)
{
    int const fd = Open({"/dev/fb0", "/dev/fb/0", "/devfs/fb/0"}, flags | O_RDWR);
    Tell("IOPERM", ioperm(0x3CE, 2, 1));
    fb_fix_screeninfo fixed{};
    Request("FBIOGET_FSCREENINFO", fd, FBIOGET_FSCREENINFO, &fixed);
    fb_var_screeninfo variable{};
    Request("FBIOGET_VSCREENINFO", fd, FBIOGET_VSCREENINFO, &variable);
    std::printf("mode %ux%ux%u(%u,%u,%u) pitch %u\n", variable.xres, variable.yres, variable.bits_per_pixel,
        variable.red.length, variable.green.length, variable.blue.length, fixed.line_length);
    void* const memory = mmap(nullptr, 4096, PROT_READ | PROT_WRITE, MAP_SHARED, fd, 0);
    Tell("MMAP", memory == MAP_FAILED ? -1 : 0);
    UploadRamp(fd);
}

void LookAtTty(int flags)
{
    int const fd = Open({"/dev/tty0", "/dev/tty"}, flags | O_RDONLY | O_NONBLOCK);
    int value = 0;
    vt_mode vt{};
    vt_stat state{};
    Request("KDGKBLED", fd, KDGKBLED, &value);
    Number("KDSKBLED", fd, KDSKBLED, LED_NUM);
    Request("KDGKBMODE", fd, KDGKBMODE, &value);
    Number("KDSKBMODE", fd, KDSKBMODE, K_MEDIUMRAW);
    Request("KDGETMODE", fd, KDGETMODE, &value);
    Number("KDSETMODE", fd, KDSETMODE, KD_GRAPHICS);
    Request("VT_GETMODE", fd, VT_GETMODE, &vt);
    Request("VT_SETMODE", fd, VT_SETMODE, &vt);
    Request("VT_GETSTATE", fd, VT_GETSTATE, &state);
    Number("VT_ACTIVATE", fd, VT_ACTIVATE, state.v_active == 0 ? 1 : state.v_active);
    vt.mode = VT_PROCESS;
    ioctl(fd, VT_SETMODE, &vt);
    Number("VT_RELDISP", fd, VT_RELDISP, VT_ACKACQ);
    termios settings{};
    Tell("termios", tcgetattr(fd, &settings));
}

void LookAtMouse(int flags)
{
    int const fd = Open({"/dev/mice", "/dev/input/mice"}, flags | O_RDWR);
    if (fd == -1) return;
    static constexpr unsigned char kWheel[] = {0xF3, 200, 0xF3, 100, 0xF3, 80};
    static constexpr unsigned char kGetId = 0xF2;
    unsigned char acknowledge = 0;
    unsigned char id = 0;
    if (write(fd, kWheel, sizeof kWheel) != sizeof kWheel || write(fd, &kGetId, 1) != 1 ||
        read(fd, &acknowledge, 1) != 1 || read(fd, &id, 1) != 1)
        std::printf("mouse speechless\n");
    std::printf("mouse %02x %02x\n", acknowledge, id);
}

bool Draw(char** pixels, int count)
{
    int const fd = open("/dev/fb0", O_RDWR);
    fb_fix_screeninfo fixed{};
    fb_var_screeninfo variable{};
    if (ioctl(fd, FBIOGET_FSCREENINFO, &fixed) == -1 || ioctl(fd, FBIOGET_VSCREENINFO, &variable) == -1)
        return false;
    if (variable.bits_per_pixel == 8) UploadRamp(fd);
    void* const memory = mmap(nullptr, fixed.smem_len, PROT_READ | PROT_WRITE, MAP_SHARED, fd, 0);
    if (memory == MAP_FAILED) return false;
    unsigned const step = variable.bits_per_pixel / 8;
    auto* const first = static_cast<unsigned char*>(memory);
    auto* const end = first + fixed.line_length * (variable.yres - 1) + variable.xres * step;
    for (int i = 0; i < count; ++i) {
        auto const pixel = std::strtoul(pixels[i], nullptr, 16);
        std::memcpy(first + static_cast<unsigned>(i) * step, &pixel, step);
        std::memcpy(end - static_cast<unsigned>(i + 1) * step, &pixel, step);
    }
    return true;
}

}

int main(int count, char** words)
{
    std::string const command = count > 1 ? words[1] : "";
    if (command == "look") {
        // Flags that the compiler doesn't know make it call libc's checked forms when it is asked to.
        int const flags = count > 2 ? std::atoi(words[2]) : 0;
        LookAtFramebuffer(flags);
        LookAtTty(flags);
        LookAtMouse(flags);
    } else if (command == "wait") {
        std::puts("ready");
        std::fflush(stdout);
        pause();
    } else {
        if (!Draw(words + 2, count - 2)) return 1;
        if (command == "die") std::raise(SIGKILL);
    }
    return 0;
}
