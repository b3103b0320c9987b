#include <tessella/console_l.h>

#include <tessella/keyboard_l.h>

#include <cerrno>
#include <csignal>

#include <linux/vt.h>
#include <sys/ioctl.h>

void GrConsoleSignal(int number)
{
    int const errnoBefore = errno;
    signal(number, GrConsoleSignal);
    ioctl(ConsoleTty(), VT_RELDISP, 0);
    errno = errnoBefore;
}
