#include <tessella/vga_l.h>

#include <sys/io.h>

namespace {

constexpr unsigned short kGraphicsController = 0x3CE;  // index; its data port follows

}

void RequestVgaPorts() { static_cast<void>(ioperm(kGraphicsController, 2, 1)); }

void WriteVgaPort(unsigned word) { outw(static_cast<unsigned short>(word), kGraphicsController); }
