// A program that uses the devices as a full-screen program does, and tells what it sees. It knows nothing of
// the virtual console.
//
//   device_probe FLAGS PIXEL...     opens every device with further flags, makes every request, prints a line
//                                   for each, puts pixels into the first row and, from its end, the last

#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include <fcntl.h>
#include <linux/fb.h>
#include <linux/kd.h>
#include <linux/vt.h>
#include <sys/io.h>
#include <sys/ioctl.h>
#include <sys/mman.h>
#include <unistd.h>

#define TELL(name, call) std::printf("%s %s\n", name, (call) == -1 ? strerrorname_np(errno) : "ok")
#define OPEN(path, how) TELL(path, fd = open(path, (how) | flags))
#define REQUEST(number, argument) TELL(#number, ioctl(fd, number, argument))

int main(int, char** words)
{
    // Flags that the compiler doesn't know make it call libc's checked forms when it is asked to.
    int const flags = std::atoi(words[1]);
    int fd = -1;
    OPEN("/dev/fb0", O_RDWR);
    TELL("IOPERM", ioperm(0x3CE, 2, 1));
    fb_fix_screeninfo fixed{};
    fb_var_screeninfo told{};
    REQUEST(FBIOGET_FSCREENINFO, &fixed);
    REQUEST(FBIOGET_VSCREENINFO, &told);
    std::printf("mode %ux%ux%u(%u,%u,%u) pitch %u\n", told.xres, told.yres, told.bits_per_pixel,
        told.red.length, told.green.length, told.blue.length, fixed.line_length);
    void* const memory = mmap(nullptr, 4096, PROT_READ | PROT_WRITE, MAP_SHARED, fd, 0);
    TELL("MMAP", memory == MAP_FAILED ? -1 : 0);
    std::uint16_t up[256], down[256];
    for (unsigned i = 0; i < 256; ++i)
        down[255 - i] = up[i] = static_cast<std::uint16_t>(i << 8);
    fb_cmap map{0, 256, up, down, up, nullptr};
    REQUEST(FBIOPUTCMAP, &map);
    unsigned const step = told.bits_per_pixel / 8;
    auto* first = static_cast<unsigned char*>(memory);
    auto* end = first + fixed.line_length * (told.yres - 1) + told.xres * step;
    for (char** word = words + 2; *word != nullptr; ++word, first += step) {
        auto const pixel = std::strtoul(*word, nullptr, 16);
        std::memcpy(first, &pixel, step);
        std::memcpy(end -= step, &pixel, step);
    }

    OPEN("/dev/tty0", O_RDONLY | O_NONBLOCK);
    int value = 0;
    vt_mode vt{};
    vt_stat state{};
    REQUEST(KDGKBLED, &value);
    REQUEST(KDSKBLED, LED_NUM);
    REQUEST(KDGKBMODE, &value);
    REQUEST(KDSKBMODE, K_MEDIUMRAW);
    REQUEST(KDGETMODE, &value);
    REQUEST(KDSETMODE, KD_GRAPHICS);
    REQUEST(VT_GETMODE, &vt);
    vt.mode = VT_PROCESS;
    REQUEST(VT_SETMODE, &vt);
    REQUEST(VT_GETSTATE, &state);
    REQUEST(VT_ACTIVATE, 1);
    REQUEST(VT_WAITACTIVE, 1);
    REQUEST(VT_RELDISP, VT_ACKACQ);

    OPEN("/dev/mice", O_RDWR);
    unsigned char answer[2] = {};
    if (write(fd, "\xF3\xC8\xF3\x64\xF3\x50", 6) == 6 && write(fd, "\xF2", 1) == 1 &&
        read(fd, answer, 2) == 2)
        std::printf("mouse %02x %02x\n", answer[0], answer[1]);
}
