#include <tessella/vga_l.h>

#include <sys/io.h>

namespace {

constexpr unsigned short kGraphicsController = 0x3CE;  // index; its data port follows

}

void RequestVgaPorts() { static_cast<void>(ioperm(kGraphicsController, 2, 1)); }

void WriteVgaPort(unsigned word)
{
    // The compiler doesn't know that stores before and behind mean something else.
    asm volatile("" ::: "memory");
    outw(static_cast<unsigned short>(word), kGraphicsController);
    asm volatile("" ::: "memory");
}
