// Prints how the console that is shown is set up: keyboard, screen, say in switches, terminal, lights.

#include <cstdio>

#include <fcntl.h>
#include <linux/kd.h>
#include <linux/vt.h>
#include <sys/ioctl.h>
#include <termios.h>

int main()
{
    int const tty = open("/dev/tty0", O_RDONLY | O_NONBLOCK | O_NOCTTY);
    int keys = -1, screen = -1, leds = 0;
    vt_mode vt{};
    termios terminal{};
    ioctl(tty, KDGKBMODE, &keys);
    ioctl(tty, KDGETMODE, &screen);
    ioctl(tty, KDGKBLED, &leds);
    ioctl(tty, VT_GETMODE, &vt);
    tcgetattr(tty, &terminal);
    std::printf("keys %d screen %d switch %d input %x output %x local %x leds %d\n", keys, screen, vt.mode,
        terminal.c_iflag, terminal.c_oflag, terminal.c_lflag, leds);
}
